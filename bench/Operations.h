#pragma once

#include <stdexcept>

namespace QVSa::bench {

// Each registers the pairs of its classes.
void addUserPairs();
void addNumberPairs();
void addDepartmentPairs();
void addOrganisationPairs();
void addLogPairs();
void addClassPairs();
void addHomePairs();
void addMaintenancePairs();

// Prints how a day of the log is found, and the memory that an export of it takes.
void tellLogFacts();

// Throws what an object says about its last failure, unless `good`.
template <class Object>
void require(bool good, const Object& object) {
  if (!good) throw std::runtime_error(object.errDescription());
}

}  // namespace QVSa::bench
