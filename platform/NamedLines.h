#pragma once

#include <vector>

#include "QVSa/values/Values.h"

namespace QVSa::platform {

struct NamedLine {
  Long number = 0;  // of the line, from 1
  String name;      // empty where the line is no "name = value"
  String value;
};

// The lines of a file of settings or secrets: "name = value", white space around both passed over, a carriage return at
// the end too. Empty lines and comments behind "#" are left out.
std::vector<NamedLine> namedLines(const String& content);

}  // namespace QVSa::platform
