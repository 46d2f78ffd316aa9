#pragma once

#include <cstdint>
#include <span>

namespace QVSa::platform {

// Fills at most 256 bytes with random ones from the system, fit for keys. Needs no memory, and works at any moment of a
// program's life. Throws 51 where the system has none.
void fillRandom(std::span<std::uint8_t> bytes);

}  // namespace QVSa::platform
