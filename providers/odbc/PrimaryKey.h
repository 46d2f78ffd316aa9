#pragma once

#include <chrono>
#include <vector>

#include "providers/odbc/Connection.h"
#include "providers/tsql/Tree.h"

namespace QVSa::odbc {

// The columns of a table's primary key, in its order; empty where it has none. A synonym's are those of its table.
std::vector<String> primaryKey(Connection& connection, const tsql::ObjectName& table, std::chrono::seconds timeout);

}  // namespace QVSa::odbc
