#include "QVSa/values/Text.h"

#include <algorithm>
#include <cerrno>
#include <clocale>
#include <locale.h>
#include <new>
#include <wctype.h>

#include "QVSa/values/Failure.h"

namespace QVSa {

namespace {

constexpr char32_t replacement = 0xFFFD;

bool isAscii(const String& text) {
  return std::all_of(text.begin(), text.end(), [](char c) { return static_cast<unsigned char>(c) < 0x80; });
}

bool isSurrogate(char32_t c) { return c >= 0xD800 && c <= 0xDFFF; }

std::size_t sequenceLength(unsigned char lead) {
  if (lead < 0x80) return 1;
  if (lead >= 0xC2 && lead <= 0xDF) return 2;
  if (lead >= 0xE0 && lead <= 0xEF) return 3;
  if (lead >= 0xF0 && lead <= 0xF4) return 4;
  return 0;
}

// The character at `at`, which steps behind it; over a byte that begins none, one byte.
char32_t nextCharacter(const String& text, std::size_t& at) {
  const unsigned char lead = static_cast<unsigned char>(text[at]);
  const std::size_t length = sequenceLength(lead);
  if (length == 1) return static_cast<unsigned char>(text[at++]);

  char32_t c = lead & (0x7F >> length);
  bool whole = length != 0 && at + length <= text.size();
  for (std::size_t i = 1; whole && i < length; ++i) {
    const unsigned char byte = static_cast<unsigned char>(text[at + i]);
    whole = (byte & 0xC0) == 0x80;
    c = c << 6 | (byte & 0x3F);
  }
  const bool overlong = (length == 3 && c < 0x800) || (length == 4 && c < 0x10000);
  if (!whole || overlong || c > 0x10FFFF || isSurrogate(c)) {
    ++at;
    return replacement;
  }
  at += length;
  return c;
}

void append(String& text, char32_t c) {
  const auto put = [&](char32_t byte) { text.push_back(static_cast<char>(byte)); };
  const auto putTail = [&](int shift) { put(0x80 | (c >> shift & 0x3F)); };
  if (c < 0x80) {
    put(c);
  } else if (c < 0x800) {
    put(0xC0 | c >> 6);
    putTail(0);
  } else if (c < 0x10000) {
    put(0xE0 | c >> 12);
    putTail(6);
    putTail(0);
  } else {
    put(0xF0 | c >> 18);
    putTail(12);
    putTail(6);
    putTail(0);
  }
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
  for (std::size_t at = 0; at < text.size();) append(result, map(nextCharacter(text, at), locale));
  return result;
}

void requireLength(Long units) {
  if (units < 0) throw runtimeFailure(number::argument);
}

}  // namespace

std::u16string toUtf16(const String& text) {
  std::u16string result;
  result.reserve(text.size());
  for (std::size_t at = 0; at < text.size();) {
    const char32_t c = nextCharacter(text, at);
    if (c < 0x10000) {
      result.push_back(static_cast<char16_t>(c));
    } else {
      result.push_back(static_cast<char16_t>(0xD800 + ((c - 0x10000) >> 10)));
      result.push_back(static_cast<char16_t>(0xDC00 + (c & 0x3FF)));
    }
  }
  return result;
}

String fromUtf16(const std::u16string& text) {
  String result;
  result.reserve(text.size());
  for (std::size_t at = 0; at < text.size(); ++at) {
    const char32_t unit = text[at];
    const bool pair =
        unit >= 0xD800 && unit <= 0xDBFF && at + 1 < text.size() && text[at + 1] >= 0xDC00 && text[at + 1] <= 0xDFFF;
    if (pair) {
      append(result, 0x10000 + ((unit - 0xD800) << 10) + (text[++at] - 0xDC00U));
    } else {
      append(result, isSurrogate(unit) ? replacement : unit);
    }
  }
  return result;
}

Long textLength(const String& text) {
  Long units = 0;
  for (std::size_t at = 0; at < text.size();) units += nextCharacter(text, at) < 0x10000 ? 1 : 2;
  return units;
}

String trimLeft(const String& text) {
  const std::size_t first = text.find_first_not_of(' ');
  return first == String::npos ? String() : text.substr(first);
}

String trimRight(const String& text) { return text.substr(0, text.find_last_not_of(' ') + 1); }

String trim(const String& text) { return trimLeft(trimRight(text)); }

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
