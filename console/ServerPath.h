#pragma once

#include "console/Console.h"

namespace QVSa::console {

// A path as the database server sees it: of an embedded installation one of this machine, made absolute; else as it is.
String serverPath(const Console& console, const String& path);

}  // namespace QVSa::console
