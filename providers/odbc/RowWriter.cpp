#include "providers/odbc/RowWriter.h"

#include "providers/tsql/Printer.h"
#include "providers/tsql/SqlFailure.h"

namespace QVSa::odbc {

void RowWriter::write(Connection& connection, const std::vector<Variant>& row,
                      const std::vector<std::pair<std::size_t, Variant>>& changes) const {
  if (changes.empty()) return;
  String text = "update " + table;
  std::vector<Parameter> parameters;
  const auto add = [&](const char* before, std::size_t ordinal, const Variant& value) {
    text += before + tsql::printName(columns[ordinal]) + "=?";
    parameters.emplace_back(value, types[ordinal]);
  };
  const char* before = " set ";
  for (const auto& [ordinal, value] : changes) {
    add(before, ordinal, value);
    before = ",";
  }
  before = " where ";
  for (const std::size_t ordinal : key) {
    add(before, ordinal, row[ordinal]);
    before = " and ";
  }
  const auto statement = connection.statement(timeout);
  statement->execute(text, parameters);
  // A count of -1 is a session that does not count.
  if (statement->affected() == 0) throw tsql::rowGone();
}

}  // namespace QVSa::odbc
