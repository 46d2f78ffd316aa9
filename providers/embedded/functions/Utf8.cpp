#include "providers/embedded/functions/Utf8.h"

#include <algorithm>

namespace QVSa::embedded {

namespace {

constexpr char32_t strayByte = 0x110000;
constexpr char32_t replacement = 0xFFFD;

unsigned char byteAt(const char* at) { return static_cast<unsigned char>(*at); }

bool isAscii(std::string_view text) {
  return std::none_of(text.begin(), text.end(), [](char c) { return (c & 0x80) != 0; });
}

struct Lead {
  int following;
  char32_t bits;
  char32_t least;  // a smaller value would be an overlong form
};

Lead leadOf(unsigned char byte) {
  if (byte >= 0xC2 && byte <= 0xDF) return {1, byte & 0x1FU, 0x80};
  if ((byte & 0xF0) == 0xE0) return {2, byte & 0x0FU, 0x800};
  if (byte >= 0xF0 && byte <= 0xF4) return {3, byte & 0x07U, 0x10000};
  return {0, 0, 0};
}

int unitsOfSymbol(char32_t symbol) { return symbol >= 0x10000 && symbol < strayByte ? 2 : 1; }

}  // namespace

char32_t nextWideSymbol(const char*& at, const char* end) {
  const unsigned char first = byteAt(at++);
  const Lead lead = leadOf(first);
  if (lead.following == 0 || end - at < lead.following) return strayByte + first;
  char32_t point = lead.bits;
  for (int i = 0; i < lead.following; ++i) {
    if ((byteAt(at + i) & 0xC0) != 0x80) return strayByte + first;
    point = point << 6 | (byteAt(at + i) & 0x3FU);
  }
  if (point < lead.least || point >= strayByte || (point >= 0xD800 && point < 0xE000)) return strayByte + first;
  at += lead.following;
  return point;
}

void appendSymbol(std::string& text, char32_t symbol) {
  if (symbol < 0x80) {
    text += static_cast<char>(symbol);
  } else if (symbol < 0x800) {
    text += static_cast<char>(0xC0 | symbol >> 6);
    text += static_cast<char>(0x80 | (symbol & 0x3F));
  } else if (symbol < 0x10000) {
    text += static_cast<char>(0xE0 | symbol >> 12);
    text += static_cast<char>(0x80 | (symbol >> 6 & 0x3F));
    text += static_cast<char>(0x80 | (symbol & 0x3F));
  } else if (symbol < strayByte) {
    text += static_cast<char>(0xF0 | symbol >> 18);
    text += static_cast<char>(0x80 | (symbol >> 12 & 0x3F));
    text += static_cast<char>(0x80 | (symbol >> 6 & 0x3F));
    text += static_cast<char>(0x80 | (symbol & 0x3F));
  } else {
    text += static_cast<char>(symbol - strayByte);
  }
}

std::int64_t unitsOf(std::string_view text) {
  if (isAscii(text)) return static_cast<std::int64_t>(text.size());
  std::int64_t units = 0;
  const char* const end = text.data() + text.size();
  for (const char* at = text.data(); at < end;) units += unitsOfSymbol(nextSymbol(at, end));
  return units;
}

std::string unitsAt(std::string_view text, std::int64_t first, std::int64_t count) {
  if (first < 0 || count <= 0) return {};
  if (isAscii(text)) {
    if (first >= static_cast<std::int64_t>(text.size())) return {};
    return std::string(text.substr(static_cast<std::size_t>(first), static_cast<std::size_t>(count)));
  }
  std::string result;
  std::int64_t unit = 0;
  const char* const end = text.data() + text.size();
  for (const char* at = text.data(); at < end && unit - first < count;) {
    const char* const begin = at;
    const char32_t symbol = nextSymbol(at, end);
    const int width = unitsOfSymbol(symbol);
    const std::int64_t inside =
        std::min(unit + width, first + std::min(count, INT64_MAX - first)) - std::max(unit, first);
    if (inside == width) result.append(begin, at);
    if (inside > 0 && inside < width) appendSymbol(result, replacement);
    unit += width;
  }
  return result;
}

std::string_view withoutTrailingBlanks(std::string_view text) { return text.substr(0, text.find_last_not_of(' ') + 1); }

}  // namespace QVSa::embedded
