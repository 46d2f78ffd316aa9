#pragma once

#include <array>
#include <cstdint>
#include <functional>

namespace QVSa::embedded {

// What stands in the file of a backup behind the last page, where SQLite does not look: a mark, the number
// of bytes before it, and their SHA-256. It covers every byte of the copy, its free pages too.
inline constexpr std::size_t trailerSize = 48;
using Trailer = std::array<std::uint8_t, trailerSize>;

// Reads so many bytes of a file from a place on. Throws where it can't.
using ReadBytes = std::function<void(void* bytes, std::size_t count, std::int64_t place)>;

// The trailer for the first `length` bytes of a file.
Trailer trailerOf(const ReadBytes& read, std::int64_t length);

}  // namespace QVSa::embedded
