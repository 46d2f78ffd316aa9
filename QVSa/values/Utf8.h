#pragma once

#include <string>

namespace QVSa {

// A byte that belongs to no well-formed sequence of UTF-8 reads as a symbol of its own, this and the byte, so that two
// texts of different bytes are different symbols too.
constexpr char32_t strayByte = 0x110000;
// U+FFFD, which stands for what a code can't hold.
constexpr char32_t replacementSymbol = 0xFFFD;

// nextSymbol's way where no ASCII symbol stands.
char32_t nextWideSymbol(const char*& at, const char* end);

// Reads the symbol at `at` and moves behind it; `at` stands before `end`.
inline char32_t nextSymbol(const char*& at, const char* end) {
  const auto first = static_cast<unsigned char>(*at);
  if (first >= 0x80) return nextWideSymbol(at, end);
  ++at;
  return first;
}

// Writes a symbol that nextSymbol read, or any code point.
void appendSymbol(std::string& text, char32_t symbol);

constexpr bool isHighSurrogate(char32_t unit) { return unit >= 0xD800 && unit <= 0xDBFF; }
constexpr bool isLowSurrogate(char32_t unit) { return unit >= 0xDC00 && unit <= 0xDFFF; }
constexpr char32_t fromSurrogates(char32_t high, char32_t low) {
  return 0x10000 + ((high - 0xD800) << 10) + (low - 0xDC00);
}

// UTF-16 units of a symbol; a stray byte has one.
constexpr int unitsOfSymbol(char32_t symbol) { return symbol >= 0x10000 && symbol < strayByte ? 2 : 1; }

// Hands the UTF-16 units of a symbol to `put`; a stray byte becomes U+FFFD.
template <class Put>
void putUnits(char32_t symbol, const Put& put) {
  if (symbol >= strayByte) symbol = replacementSymbol;
  if (symbol < 0x10000) return put(static_cast<char16_t>(symbol));
  put(static_cast<char16_t>(0xD800 + ((symbol - 0x10000) >> 10)));
  put(static_cast<char16_t>(0xDC00 + (symbol & 0x3FF)));
}

}  // namespace QVSa
