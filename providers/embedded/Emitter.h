#pragma once

#include <string>

#include "providers/embedded/Bound.h"

namespace QVSa::embedded {

// Writes bound statements as the storage library's SQL: every table qualified by its database, every literal a numbered
// parameter, result columns named c0, c1, ... by their place.
std::string emit(const BoundExpression& expression);
std::string emit(const BoundSelect& select);
std::string emit(const BoundInsert& insert);
std::string emit(const BoundUpdate& update);
std::string emit(const BoundDelete& erase);

}  // namespace QVSa::embedded
