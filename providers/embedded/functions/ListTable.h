#pragma once

#include <memory>
#include <vector>

#include "providers/embedded/bind/Types.h"

struct sqlite3;
struct sqlite3_stmt;

namespace QVSa::embedded {

using ValueList = std::vector<Value>;

// The table-valued function list(?) with one column, value: what makes "in (1, 2, ...)" one parameter. And
// t_listed(value, ?), whether a sorted list holds the value: a filter behind a condition that has its index already.
void registerListTable(sqlite3* handle);

// Binds the values to the parameter; it keeps its share of them until it is bound anew.
void bindList(sqlite3_stmt* statement, int parameter, std::shared_ptr<const ValueList> values);

}  // namespace QVSa::embedded
