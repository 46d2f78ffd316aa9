#pragma once

#include "tests/faults/Operations.h"

namespace QVSa::test {

// Those of the system log, the report classes, the access rule and the template password.
std::vector<Operation> logAndClassOperations();
void fillLogAndClasses(const String& server);

}  // namespace QVSa::test
