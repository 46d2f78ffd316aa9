#pragma once

#include "tests/faults/Operations.h"

namespace QVSa::test {

// Those of the settings, of self-registration, and of the sign-on of accounts that others vouch for.
std::vector<Operation> settingsOperations();
void fillSettings(const String& server);

}  // namespace QVSa::test
