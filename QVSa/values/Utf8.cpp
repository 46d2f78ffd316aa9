#include "QVSa/values/Utf8.h"

namespace QVSa {

namespace {

unsigned char byteAt(const char* at) { return static_cast<unsigned char>(*at); }

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

}  // namespace QVSa
