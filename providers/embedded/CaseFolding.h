#pragma once

namespace QVSa::embedded {

// Case mappings of every script, one code point to one, independent of the locale. Symbols beyond Unicode stay as they
// are. The folding is frozen: the order of every text index rests on it.
char32_t foldCase(char32_t point);
char32_t upperCase(char32_t point);
char32_t lowerCase(char32_t point);

}  // namespace QVSa::embedded
