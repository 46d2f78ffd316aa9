#pragma once

#include "tests/faults/Operations.h"

namespace QVSa::test {

// Those of schedules, backup plans and backups. A restore changes whole databases and has tests of its own.
std::vector<Operation> maintenanceOperations();
std::vector<LetPass> maintenanceLetPass();
void fillMaintenance(const String& server);

}  // namespace QVSa::test
