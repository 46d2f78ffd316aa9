#pragma once

#include "providers/tsql/Tree.h"

namespace QVSa::tsql {

// Rewrites the old outer joins (*= and =*) of a query's blocks, its subqueries included, to left joins: the inner
// tables move behind the others of their from list, each with its join conditions and those conditions of the where
// clause that speak of it alone. Tables of an old join are named by alias or table name at every column of the
// condition; a column without a qualifier belongs to no inner table. Throws 4104 where a qualifier names no table of
// the block, 303 where a table is the inner side of a join and takes part in an ordinary one as well.
void rewriteOuterJoins(Select& select);
void rewriteOuterJoins(Statement& statement);

// Whether a batch holds an old outer join at all.
bool hasOuterJoins(const std::vector<Token>& tokens);

}  // namespace QVSa::tsql
