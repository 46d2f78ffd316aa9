#pragma once

#include <cstdint>
#include <string>
#include <string_view>

namespace QVSa::embedded {

// nextSymbol's way where no ASCII symbol stands.
char32_t nextWideSymbol(const char*& at, const char* end);

// Reads the symbol at `at` and moves behind it; `at` stands before `end`. A byte that belongs to no well-formed
// sequence is a symbol of its own, 0x110000 and the byte, so that any two texts of different bytes are different
// symbols too.
inline char32_t nextSymbol(const char*& at, const char* end) {
  const auto first = static_cast<unsigned char>(*at);
  if (first >= 0x80) return nextWideSymbol(at, end);
  ++at;
  return first;
}

// Writes a symbol that nextSymbol read, or any code point.
void appendSymbol(std::string& text, char32_t symbol);

// Length in UTF-16 units; a stray byte counts as one.
std::int64_t unitsOf(std::string_view text);

// The units from `first` (counted from 0) on, at most `count` of them. Half of a pair becomes U+FFFD.
std::string unitsAt(std::string_view text, std::int64_t first, std::int64_t count);

// Without its trailing blanks (U+0020).
std::string_view withoutTrailingBlanks(std::string_view text);

}  // namespace QVSa::embedded
