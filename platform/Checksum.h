#pragma once

#include <cstdint>
#include <span>

namespace QVSa::platform {

// The standard CRC-32 (reflected polynomial 0xEDB88320). Over several pieces: 0 first, then what the piece before gave.
std::uint32_t crc32(std::uint32_t before, std::span<const std::uint8_t> bytes);

}  // namespace QVSa::platform
