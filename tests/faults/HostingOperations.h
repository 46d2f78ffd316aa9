#pragma once

#include "tests/faults/Operations.h"

namespace QVSa::test {

// Those of what hosts need beyond the public classes.
std::vector<Operation> hostingOperations();
std::vector<LetPass> hostingLetPass();

}  // namespace QVSa::test
