#pragma once

#include "providers/embedded/bind/Types.h"
#include "providers/tsql/Tree.h"

namespace QVSa::embedded {

// The engine's type for a type's name. Throws 2715 for an unknown one.
Type typeOf(const tsql::TypeName& name);

}  // namespace QVSa::embedded
