#pragma once

#include "providers/tsql/Printer.h"

namespace QVSa::odbc {

// A table's name as it stands in a statement.
inline String objectText(const tsql::ObjectName& table) {
  String text;
  if (!table.database.empty()) text += tsql::printName(table.database) + ".";
  if (!table.owner.empty()) text += tsql::printName(table.owner);
  if (!table.database.empty() || !table.owner.empty()) text += ".";
  return text + tsql::printName(table.name);
}

}  // namespace QVSa::odbc
