#pragma once

#include "providers/embedded/bind/Bound.h"

namespace QVSa::embedded {

// The table whose rows are those of the block: the only one, or the one that all others are joined to on a key of
// theirs, so that each of its rows comes once at most. Null where there is none.
const BoundSource* rowsOf(const BoundCore& core);

}  // namespace QVSa::embedded
