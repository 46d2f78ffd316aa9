#pragma once

#include "providers/tsql/Tree.h"

namespace QVSa::tsql {

// Writes a tree back as T-SQL: what the parser reads from it is the same tree.
String print(const Statement& statement);
String print(const Select& select);
String print(const Expression& expression);
String print(const TypeName& type);
// With brackets where the name is a reserved word or needs them.
String printName(const String& name);

}  // namespace QVSa::tsql
