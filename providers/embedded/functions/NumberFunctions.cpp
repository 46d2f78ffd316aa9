#include <cmath>
#include <cstdlib>
#include <cstring>
#include <limits>
#include <type_traits>

#include "providers/embedded/functions/Decimal.h"
#include "providers/embedded/functions/Function.h"
#include "providers/tsql/SqlFailure.h"

namespace QVSa::embedded {

namespace {

using tsql::sqlFailure;

Failure overflow(const char* type) {
  return sqlFailure(8115, std::string("Arithmetic overflow error converting expression to data type ") + type + ".");
}

Failure divideByZero() { return sqlFailure(8134, "Divide by zero error encountered."); }

// ---- t_calculate: a kind of numbers each

struct Int {
  using Number = std::int64_t;
  static Number take(const Call& call, int i) { return call.whole(i); }
  static void give(Call& call, Number value) { call.give(value); }
  static Number checked(bool overflowed, Number value) {
    if (overflowed || value != static_cast<std::int32_t>(value)) throw overflow("int");
    return value;
  }
};

struct Bigint : Int {
  static Number checked(bool overflowed, Number value) {
    if (overflowed) throw overflow("bigint");
    return value;
  }
};

struct Real {
  using Number = double;
  static Number take(const Call& call, int i) { return call.real(i); }
  static void give(Call& call, Number value) { call.give(value); }
  static Number checked(bool, Number value) {
    if (!std::isfinite(value)) throw overflow("float");
    return value;
  }
};

struct Exact {
  using Number = Decimal;
  static Number take(const Call& call, int i) { return call.decimal(i); }
  static void give(Call& call, Number value) { call.give(storedDecimal(value)); }
  static Number checked(bool, Number value) { return requireDigits(value, mostDecimalDigits); }
};

template <class Number>
Number bitwise(char op, Number a, Number b) {
  return op == '&' ? a & b : op == '|' ? a | b : a ^ b;
}

template <class Kind>
typename Kind::Number combined(char op, typename Kind::Number a, typename Kind::Number b) {
  using Number = typename Kind::Number;
  Number result{};
  if ((op == '/' || op == '%') && b == 0) throw divideByZero();
  if constexpr (std::is_same_v<Number, double>) {
    result = op == '+' ? a + b : op == '-' ? a - b : op == '*' ? a * b : a / b;
    return Kind::checked(false, result);
  } else {
    bool overflowed = false;
    switch (op) {
      case '+':
        overflowed = __builtin_add_overflow(a, b, &result);
        break;
      case '-':
        overflowed = __builtin_sub_overflow(a, b, &result);
        break;
      case '*':
        overflowed = __builtin_mul_overflow(a, b, &result);
        break;
      case '/':
      case '%':
        // The least number has no counterpart above 0.
        if (b == -1)
          overflowed = op == '/' && __builtin_sub_overflow(Number{0}, a, &result);
        else
          result = op == '/' ? a / b : a % b;
        break;
      default:
        result = bitwise(op, a, b);
    }
    return Kind::checked(overflowed, result);
  }
}

// The operands of a calculation one after the other, whether they are arguments or lie in packs.
template <class Kind>
class Operands {
 public:
  using Number = typename Kind::Number;

  Operands(const Call& call, bool packed) : call_(call), packed_(packed) {}

  Number next() {
    if (!packed_) return Kind::take(call_, at_++);
    if (taken_ == call_.bytes(at_).size()) {
      taken_ = 0;
      ++at_;
    }
    Number number{};
    std::memcpy(&number, call_.bytes(at_).data() + taken_, sizeof number);
    taken_ += sizeof number;
    return number;
  }

 private:
  const Call& call_;
  bool packed_;
  int at_ = 0;
  std::size_t taken_ = 0;
};

template <class Kind>
void calculateAll(Call& call, std::string_view operators, bool packed) {
  Operands<Kind> operands(call, packed);
  typename Kind::Number result = operands.next();
  for (const char op : operators) result = combined<Kind>(op, result, operands.next());
  Kind::give(call, result);
}

// The last argument tells the kind of number and the operators between the others: 'i+-' for three ints, 'I+-' where
// they lie in packs.
void calculate(Call& call) {
  const std::string_view form = call.text(call.count() - 1);
  const std::string_view operators = form.substr(1);
  const bool packed = form[0] < 'a';
  switch (form[0] | 0x20) {
    case 'i':
      return calculateAll<Int>(call, operators, packed);
    case 'b':
      return calculateAll<Bigint>(call, operators, packed);
    case 'r':
      return calculateAll<Real>(call, operators, packed);
    default:
      return calculateAll<Exact>(call, operators, packed);
  }
}

template <class Kind>
void packAll(Call& call) {
  Bytes bytes;
  for (int i = 0; i + 1 < call.count(); ++i) {
    const typename Kind::Number number = Kind::take(call, i);
    const auto* const first = reinterpret_cast<const std::uint8_t*>(&number);
    bytes.insert(bytes.end(), first, first + sizeof number);
  }
  call.give(bytes);
}

void pack(Call& call) {
  const char kind = call.text(call.count() - 1)[0];
  if (kind == 'r') return packAll<Real>(call);
  if (kind == 'd') return packAll<Exact>(call);
  packAll<Int>(call);
}

void multiplyDecimals(Call& call) {
  call.give(storedDecimal(multiplied(call.decimal(0), call.decimal(1), static_cast<int>(call.whole(2)))));
}

void divideDecimals(Call& call) {
  if (call.decimal(1) == 0) throw divideByZero();
  call.give(storedDecimal(divided(call.decimal(0), call.decimal(1), static_cast<int>(call.whole(2)))));
}

// ---- functions of one number and its type

// Gives the number, which is a decimal's or another one's.
void giveDecimal(Call& call, Decimal value, const Type& type) {
  call.give(storedDecimal(requireDigits(value, type.size)));
}

void giveWhole(Call& call, std::int64_t value, const Type& type) {
  call.give(type.base == Base::bigint ? Bigint::checked(false, value) : Int::checked(false, value));
}

void negate(Call& call) {
  const Type type = typeOfCode(call.whole(1));
  if (type.base == Base::decimal) return call.give(storedDecimal(-call.decimal(0)));
  if (type.base == Base::real) return call.give(0 - call.real(0));
  call.give(type.base == Base::bigint ? combined<Bigint>('-', 0, call.whole(0)) : combined<Int>('-', 0, call.whole(0)));
}

void complement(Call& call) {
  const Type type = typeOfCode(call.whole(1));
  const std::int64_t value = call.whole(0);
  call.give(type.base == Base::bit ? std::int64_t{value == 0} : type.base == Base::tinyint ? 255 - value : ~value);
}

void absolute(Call& call) {
  const Type type = typeOfCode(call.whole(1));
  if (type.base == Base::decimal) {
    const Decimal value = call.decimal(0);
    return call.give(storedDecimal(value < 0 ? -value : value));
  }
  if (type.base == Base::real) return call.give(std::abs(call.real(0)));
  if (call.whole(0) < 0) return negate(call);
  call.give(call.whole(0));
}

double rounded(double value, std::int64_t digits, bool cut) {
  const double scale = std::pow(10.0, static_cast<double>(digits));
  const double scaled = value * scale;
  if (!std::isfinite(scaled) || scale == 0) return digits < 0 ? 0 : value;
  return (cut ? std::trunc(scaled) : std::round(scaled)) / scale;
}

// With a third argument that is not 0, digits are cut and not rounded.
void roundNumber(Call& call) {
  const bool cut = call.count() > 3 && call.whole(2) != 0;
  const std::int64_t digits = call.whole(1);
  const Type type = typeOfCode(call.whole(call.count() - 1));
  if (type.base == Base::real) return call.give(rounded(call.real(0), digits, cut));
  if (type.base == Base::decimal) return giveDecimal(call, roundedTo(call.decimal(0), type.scale, digits, cut), type);
  giveWhole(call, static_cast<std::int64_t>(roundedTo(call.whole(0), 0, digits, cut)), type);
}

template <double (*ofReal)(double), Decimal (*ofDecimal)(Decimal, int)>
void toWhole(Call& call) {
  const Type type = typeOfCode(call.whole(1));
  if (type.base == Base::decimal) return call.give(storedDecimal(ofDecimal(call.decimal(0), type.scale)));
  call.give(type.base == Base::real ? Value(ofReal(call.real(0))) : Value(call.whole(0)));
}

double lower(double value) { return std::floor(value); }
double upper(double value) { return std::ceil(value); }

constexpr Function functions[] = {{"t_calculate", -1, calculate},
                                  {"t_pack", -1, pack},
                                  {"t_multiply", 3, multiplyDecimals},
                                  {"t_divide", 3, divideDecimals},
                                  {"t_negate", 2, negate},
                                  {"t_complement", 2, complement},
                                  {"t_abs", 2, absolute},
                                  {"t_round", 3, roundNumber},
                                  {"t_round", 4, roundNumber},
                                  {"t_floor", 2, toWhole<lower, floorOf>},
                                  {"t_ceiling", 2, toWhole<upper, ceilingOf>}};

}  // namespace

std::span<const Function> numberFunctions() { return functions; }

}  // namespace QVSa::embedded
