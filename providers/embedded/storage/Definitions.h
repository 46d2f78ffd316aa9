#pragma once

#include "providers/embedded/storage/Catalogue.h"
#include "providers/embedded/storage/Handle.h"
#include "providers/tsql/Tree.h"

namespace QVSa::embedded {

// Makes what a database needs to hold definitions: the table in which their texts stand.
void prepareDefinitions(Handle& handle, std::size_t database);

// Whether a statement makes or drops an object.
bool isDefinition(const tsql::Statement& statement);

// The database that a definition changes.
std::size_t definedDatabase(const tsql::Statement& statement, std::size_t currentDatabase);

// Runs a definition inside the handle's open transaction. The catalogue is out of date afterwards.
// Throws 2714 where the object exists, 3701 where it is not there to drop, 15025 for a log-in that exists, and the
// binder's failures for a view that cannot be bound.
void define(Handle& handle, const Catalogue& catalogue, std::size_t currentDatabase, const tsql::Statement& statement);

// Throws where a database that is open as the handle's first holds a definition that can't be read, that goes by
// another name, or whose columns are not those of its table, and where a table has none.
void requireFittingDefinitions(sqlite3* handle);

}  // namespace QVSa::embedded
