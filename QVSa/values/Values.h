#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "QVSa/values/Export.h"

namespace QVSa {

using Long = std::int32_t;
using Integer = std::int16_t;
using Boolean = bool;
// Unicode text held as UTF-8. Lengths and positions that callers see count UTF-16 units: see Text.h.
using String = std::string;
using Bytes = std::vector<std::uint8_t>;

}  // namespace QVSa
