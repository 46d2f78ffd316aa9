#include "QVSa/values/Text.h"

#include <algorithm>
#include <cerrno>
#include <clocale>
#include <locale.h>
#include <new>
#include <wctype.h>

#include "QVSa/values/Failure.h"
#include "QVSa/values/Utf8.h"

namespace QVSa {

namespace {

bool isAscii(const String& text) {
  return std::all_of(text.begin(), text.end(), [](char c) { return static_cast<unsigned char>(c) < 0x80; });
}

// The mappings of all scripts, whatever the process's own locale is.
locale_t unicode() {
  static const locale_t locale = [] {
    const locale_t made = newlocale(LC_CTYPE_MASK, "C.UTF-8", static_cast<locale_t>(nullptr));
    if (made == nullptr && errno == ENOMEM) throw std::bad_alloc();
    if (made == nullptr) throw runtimeFailure(number::internal);
    return made;
  }();
  return locale;
}

using CharacterMap = wint_t (*)(wint_t, locale_t);

String mapped(const String& text, CharacterMap map, char first, char last) {
  if (isAscii(text)) {
    String result = text;
    for (char& c : result) {
      if (c >= first && c <= last) c = static_cast<char>(c ^ 0x20);
    }
    return result;
  }
  String result;
  result.reserve(text.size());
  const locale_t locale = unicode();
  const char* const end = text.data() + text.size();
  for (const char* at = text.data(); at < end;) appendSymbol(result, map(nextSymbol(at, end), locale));
  return result;
}

void requireLength(Long units) {
  if (units < 0) throw runtimeFailure(number::argument);
}

}  // namespace

std::u16string toUtf16(const String& text) {
  std::u16string result;
  result.reserve(text.size());
  const char* const end = text.data() + text.size();
  for (const char* at = text.data(); at < end;)
    putUnits(nextSymbol(at, end), [&](char16_t unit) { result.push_back(unit); });
  return result;
}

String fromUtf16(const std::u16string& text) {
  String result;
  result.reserve(text.size());
  for (std::size_t at = 0; at < text.size(); ++at) {
    const char16_t unit = text[at];
    if (isHighSurrogate(unit) && at + 1 < text.size() && isLowSurrogate(text[at + 1])) {
      appendSymbol(result, fromSurrogates(unit, text[++at]));
    } else {
      appendSymbol(result, isHighSurrogate(unit) || isLowSurrogate(unit) ? replacementSymbol : unit);
    }
  }
  return result;
}

Long textLength(const String& text) {
  Long units = 0;
  const char* const end = text.data() + text.size();
  for (const char* at = text.data(); at < end;) units += unitsOfSymbol(nextSymbol(at, end));
  return units;
}

std::string_view trimmed(std::string_view text, std::string_view blanks) {
  const std::size_t first = text.find_first_not_of(blanks);
  return first == std::string_view::npos ? std::string_view()
                                         : text.substr(first, text.find_last_not_of(blanks) + 1 - first);
}

String trimLeft(const String& text) {
  const std::size_t first = text.find_first_not_of(' ');
  return first == String::npos ? String() : text.substr(first);
}

String trimRight(const String& text) { return text.substr(0, text.find_last_not_of(' ') + 1); }

String trim(const String& text) { return String(trimmed(text)); }

String upperCase(const String& text) { return mapped(text, towupper_l, 'a', 'z'); }

String lowerCase(const String& text) { return mapped(text, towlower_l, 'A', 'Z'); }

bool sameText(const String& a, const String& b) {
  if (!isAscii(a) || !isAscii(b)) return lowerCase(a) == lowerCase(b);
  const auto lower = [](char c) { return c >= 'A' && c <= 'Z' ? static_cast<char>(c | 0x20) : c; };
  return std::equal(a.begin(), a.end(), b.begin(), b.end(), [&](char x, char y) { return lower(x) == lower(y); });
}

String leftText(const String& text, Long units) {
  requireLength(units);
  const std::size_t count = static_cast<std::size_t>(units);
  return isAscii(text) ? text.substr(0, count) : fromUtf16(toUtf16(text).substr(0, count));
}

String rightText(const String& text, Long units) {
  requireLength(units);
  const std::u16string all = toUtf16(text);
  return fromUtf16(all.substr(all.size() - std::min(all.size(), static_cast<std::size_t>(units))));
}

std::vector<String> split(const String& text, char separator) {
  std::vector<String> parts;
  std::size_t begin = 0;
  for (std::size_t end = text.find(separator); end != String::npos; end = text.find(separator, begin)) {
    parts.push_back(text.substr(begin, end - begin));
    begin = end + 1;
  }
  parts.push_back(text.substr(begin));
  return parts;
}

String join(const std::vector<String>& parts, const String& separator) {
  String result;
  for (const String& part : parts) {
    if (&part != parts.data()) result += separator;
    result += part;
  }
  return result;
}

String replaceAll(const String& text, const String& what, const String& with) {
  if (what.empty()) return text;
  String result;
  std::size_t begin = 0;
  for (std::size_t at = text.find(what); at != String::npos; at = text.find(what, begin)) {
    result.append(text, begin, at - begin).append(with);
    begin = at + what.size();
  }
  return result.append(text, begin);
}

String text(Long value) { return std::to_string(value); }

}  // namespace QVSa
