#pragma once

#include <vector>

#include "QVSa/frame/Variant.h"
#include "console/Console.h"

namespace QVSa::console {

// The rows of a query of the system database, for what no operation of the library tells.
std::vector<std::vector<Variant>> systemRows(const Console& console, const String& query);

}  // namespace QVSa::console
