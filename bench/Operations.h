#pragma once

#include <stdexcept>

namespace QVSa::bench {

// Each registers the pairs of its classes.
void addUserPairs();
void addNumberPairs();
void addDepartmentPairs();

// Throws what an object says about its last failure, unless `good`.
template <class Object>
void require(bool good, const Object& object) {
  if (!good) throw std::runtime_error(object.errDescription());
}

}  // namespace QVSa::bench
