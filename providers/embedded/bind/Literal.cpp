#include "providers/embedded/bind/Literal.h"

#include <algorithm>
#include <charconv>

#include "providers/embedded/bind/TypeRules.h"
#include "providers/embedded/functions/Decimal.h"
#include "providers/tsql/SqlFailure.h"

namespace QVSa::embedded {

namespace {

template <class Number>
Number read(const std::string& text) {
  Number number{};
  const char* begin = text.data() + (text.starts_with('+') ? 1 : 0);
  const auto result = std::from_chars(begin, text.data() + text.size(), number);
  if (result.ec == std::errc()) return number;
  throw tsql::sqlFailure(8115, "Arithmetic overflow error converting expression to data type numeric.");
}

Bytes bytesOf(const std::string& digits) {
  Bytes bytes;
  const std::string even = digits.size() % 2 ? "0" + digits : digits;
  for (std::size_t i = 0; i < even.size(); i += 2) {
    std::uint8_t byte = 0;
    std::from_chars(even.data() + i, even.data() + i + 2, byte, 16);
    bytes.push_back(byte);
  }
  return bytes;
}

Type decimalType(const tsql::Token& token) {
  const tsql::LiteralSize size = tsql::sizeOf(token);
  if (size.whole + size.fraction > mostDecimalDigits)
    throw tsql::sqlFailure(
        1007, "The number '" + token.text + "' is out of the range for numeric representation (maximum precision 38).");
  return {Base::decimal, std::max(static_cast<int>(size.whole + size.fraction), 1), static_cast<int>(size.fraction)};
}

}  // namespace

Type literalType(const tsql::Token& token) {
  switch (token.kind) {
    case tsql::TokenKind::integer:
      return {Base::integer, -1};
    case tsql::TokenKind::decimal:
      return decimalType(token);
    case tsql::TokenKind::real:
      return {Base::real, -1};
    case tsql::TokenKind::binary:
      return {Base::image, -1};
    case tsql::TokenKind::list: {
      Type type;
      for (const tsql::Token& item : token.items) type = commonType(type, literalType(item));
      return type;
    }
    default:
      return textType(token.unicode ? Base::nvarchar : Base::varchar, tsql::sizeOf(token).isLong);
  }
}

Value literalValue(const tsql::Token& token, bool negate) {
  switch (token.kind) {
    case tsql::TokenKind::integer: {
      const auto number = read<std::int64_t>(token.text);
      return negate ? -number : number;
    }
    case tsql::TokenKind::decimal: {
      const Decimal number = readDecimal(token.text, literalType(token).scale).value_or(0);
      return storedDecimal(negate ? -number : number);
    }
    case tsql::TokenKind::real: {
      const auto number = read<double>(token.text);
      return negate ? -number : number;
    }
    case tsql::TokenKind::binary:
      return bytesOf(token.text);
    default:
      return token.text;
  }
}

std::string likePrefix(const std::string& pattern) { return pattern.substr(0, pattern.find_first_of("%_[")); }

}  // namespace QVSa::embedded
