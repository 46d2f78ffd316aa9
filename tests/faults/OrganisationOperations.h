#pragma once

#include "tests/faults/Operations.h"

namespace QVSa::test {

// Those of the department lists, roles, jobs, user lists, groups and supervisors.
std::vector<Operation> organisationOperations();
std::vector<LetPass> organisationLetPass();
void fillOrganisation(const String& server);

}  // namespace QVSa::test
