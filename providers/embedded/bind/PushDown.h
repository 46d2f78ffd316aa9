#pragma once

#include "providers/embedded/bind/Bound.h"

namespace QVSa::embedded {

// Asks a condition on a view's column where the rows of that view's recursion begin, as long as the recursion hands the
// column on unchanged: SQLite, left alone, builds the whole recursion and then throws most of it away.
void pushDown(BoundSelect& select);

}  // namespace QVSa::embedded
