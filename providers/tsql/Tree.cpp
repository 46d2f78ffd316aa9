#include "providers/tsql/Tree.h"

namespace QVSa::tsql {

// Here and not in the header: an expression may hold a select, which is complete only below it.
Expression::Expression() = default;
Expression::~Expression() = default;
Expression::Expression(Kind kindOf, std::size_t at) : kind(kindOf), position(at) {}

}  // namespace QVSa::tsql
