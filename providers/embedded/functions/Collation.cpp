#include "providers/embedded/functions/Collation.h"

#include <array>
#include <sqlite3.h>

#include "providers/embedded/functions/CaseFolding.h"
#include "providers/embedded/functions/Utf8.h"
#include "providers/embedded/storage/StorageFailure.h"

namespace QVSa::embedded {

namespace {

constexpr auto asciiFolds = [] {
  std::array<char, 128> folds{};
  for (int c = 0; c < 128; ++c)
    folds[static_cast<std::size_t>(c)] = static_cast<char>(c >= 'A' && c <= 'Z' ? c + 32 : c);
  return folds;
}();

// Moves both behind the ASCII characters that they have in common.
void skipCommonAscii(const char*& a, const char* endA, const char*& b, const char* endB) {
  for (; a < endA && b < endB; ++a, ++b) {
    const auto byteA = static_cast<unsigned char>(*a);
    const auto byteB = static_cast<unsigned char>(*b);
    if (((byteA | byteB) & 0x80) != 0 || asciiFolds[byteA] != asciiFolds[byteB]) return;
  }
}

int collate(void*, int sizeA, const void* a, int sizeB, const void* b) {
  return compareText({static_cast<const char*>(a), static_cast<std::size_t>(sizeA)},
                     {static_cast<const char*>(b), static_cast<std::size_t>(sizeB)});
}

}  // namespace

int compareText(std::string_view a, std::string_view b) {
  a = withoutTrailingBlanks(a);
  b = withoutTrailingBlanks(b);
  const char* atA = a.data();
  const char* atB = b.data();
  const char* const endA = atA + a.size();
  const char* const endB = atB + b.size();
  for (;;) {
    skipCommonAscii(atA, endA, atB, endB);
    if (atA == endA || atB == endB) break;
    const char32_t symbolA = foldCase(nextSymbol(atA, endA));
    const char32_t symbolB = foldCase(nextSymbol(atB, endB));
    if (symbolA != symbolB) return symbolA < symbolB ? -1 : 1;
  }
  return static_cast<int>(atA < endA) - static_cast<int>(atB < endB);
}

void registerCollation(sqlite3* handle) {
  const int code = sqlite3_create_collation_v2(handle, "tsql", SQLITE_UTF8, nullptr, collate, nullptr);
  if (code != SQLITE_OK) throwStorageFailure(handle, code);
}

}  // namespace QVSa::embedded
