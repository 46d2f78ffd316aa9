#pragma once

namespace QVSa::embedded {

// foldCase's way for a symbol beyond ASCII.
char32_t foldWideCase(char32_t point);

// Case mappings of every script, one code point to one, independent of the locale. Symbols beyond Unicode stay as they
// are. The folding is frozen: the order of every text index rests on it.
inline char32_t foldCase(char32_t point) {
  if (point >= 0x80) return foldWideCase(point);
  return point >= U'A' && point <= U'Z' ? point + 32 : point;
}
char32_t upperCase(char32_t point);
char32_t lowerCase(char32_t point);

}  // namespace QVSa::embedded
