#include "providers/embedded/administration/BackupTrailer.h"

#include <algorithm>
#include <string_view>
#include <vector>

#include "platform/Sha256.h"

namespace QVSa::embedded {

namespace {

constexpr std::string_view mark = "QVSaSum1";
constexpr std::size_t pieceSize = 1 << 20;

}  // namespace

Trailer trailerOf(const ReadBytes& read, std::int64_t length) {
  platform::Sha256 sum;
  std::vector<char> piece(pieceSize);
  for (std::int64_t place = 0; place < length;) {
    const auto count = std::min(piece.size(), static_cast<std::size_t>(length - place));
    read(piece.data(), count, place);
    sum.add(piece.data(), count);
    place += static_cast<std::int64_t>(count);
  }
  Trailer trailer{};
  auto at = std::ranges::copy(mark, trailer.begin()).out;
  // The lowest byte first, whatever the machine's own order.
  for (int shift = 0; shift < 64; shift += 8) *at++ = static_cast<std::uint8_t>(length >> shift);
  std::ranges::copy(sum.digest(), at);
  return trailer;
}

}  // namespace QVSa::embedded
