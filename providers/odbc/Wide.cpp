#include "providers/odbc/Wide.h"

namespace QVSa::odbc {

namespace {

constexpr char32_t replacement = 0xFFFD;

unsigned byteAt(const String& text, std::size_t at) { return static_cast<unsigned char>(text[at]); }

// The code point at `at`, which moves behind it.
char32_t nextCode(const String& text, std::size_t& at) {
  const unsigned lead = byteAt(text, at++);
  if (lead < 0x80) return lead;
  const int more = lead >= 0xF0 && lead < 0xF5   ? 3
                   : lead >= 0xE0 && lead < 0xF0 ? 2
                   : lead >= 0xC2 && lead < 0xE0 ? 1
                                                 : 0;
  if (more == 0) return replacement;
  char32_t code = lead & (0x3FU >> more);
  for (int i = 0; i < more; ++i) {
    if (at >= text.size() || (byteAt(text, at) & 0xC0U) != 0x80U) return replacement;
    code = code << 6 | (byteAt(text, at++) & 0x3FU);
  }
  constexpr char32_t smallest[] = {0, 0x80, 0x800, 0x10000};
  const bool valid = code >= smallest[more] && code <= 0x10FFFF && (code < 0xD800 || code > 0xDFFF);
  return valid ? code : replacement;
}

void appendUtf8(String& out, char32_t code) {
  const auto put = [&](char32_t byte) { out += static_cast<char>(static_cast<unsigned char>(byte)); };
  if (code < 0x80) {
    put(code);
  } else if (code < 0x800) {
    put(0xC0 | code >> 6);
    put(0x80 | (code & 0x3F));
  } else if (code < 0x10000) {
    put(0xE0 | code >> 12);
    put(0x80 | (code >> 6 & 0x3F));
    put(0x80 | (code & 0x3F));
  } else {
    put(0xF0 | code >> 18);
    put(0x80 | (code >> 12 & 0x3F));
    put(0x80 | (code >> 6 & 0x3F));
    put(0x80 | (code & 0x3F));
  }
}

bool isHigh(char16_t unit) { return unit >= 0xD800 && unit < 0xDC00; }
bool isLow(char16_t unit) { return unit >= 0xDC00 && unit < 0xE000; }

}  // namespace

std::u16string toWide(const String& text) {
  std::u16string result;
  result.reserve(text.size());
  for (std::size_t at = 0; at < text.size();) {
    const char32_t code = nextCode(text, at);
    if (code < 0x10000) {
      result += static_cast<char16_t>(code);
    } else {
      result += static_cast<char16_t>(0xD7C0 + (code >> 10));
      result += static_cast<char16_t>(0xDC00 + (code & 0x3FF));
    }
  }
  return result;
}

String fromWide(const std::u16string& text) {
  String result;
  result.reserve(text.size());
  for (std::size_t at = 0; at < text.size(); ++at) {
    const char16_t unit = text[at];
    if (isHigh(unit) && at + 1 < text.size() && isLow(text[at + 1])) {
      const char32_t high = unit - 0xD800U;
      const char32_t low = text[++at] - 0xDC00U;
      appendUtf8(result, 0x10000 + (high << 10) + low);
    } else {
      appendUtf8(result, isHigh(unit) || isLow(unit) ? replacement : unit);
    }
  }
  return result;
}

}  // namespace QVSa::odbc
