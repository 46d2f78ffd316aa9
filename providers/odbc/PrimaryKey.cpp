#include "providers/odbc/PrimaryKey.h"

#include "providers/odbc/ObjectText.h"
#include "providers/tsql/Parser.h"

namespace QVSa::odbc {

namespace {

String literal(const String& text) {
  String result = "N'";
  for (const char c : text) result += c == '\'' ? "''" : String(1, c);
  return result + "'";
}

std::vector<String> keyOfTable(Connection& connection, const tsql::ObjectName& table, std::chrono::seconds timeout) {
  constexpr std::size_t columnName = 3;
  const auto statement = connection.statement(timeout);
  statement->askPrimaryKey(table.database, table.owner, table.name);
  const ColumnType type = statement->describe(columnName).second;
  std::vector<String> result;
  while (statement->fetch()) result.push_back(statement->value(columnName, type).toText());
  return result;
}

// The table behind a synonym, as "[database].[owner].[name]"; empty where the name is no synonym.
String baseOf(Connection& connection, const tsql::ObjectName& synonym, std::chrono::seconds timeout) {
  const String catalogue = synonym.database.empty() ? "" : tsql::printName(synonym.database) + ".";
  const auto statement = connection.statement(timeout);
  statement->execute("select base_object_name from " + catalogue + "sys.synonyms where object_id=object_id(" +
                     literal(objectText(synonym)) + ")");
  const ColumnType type = statement->describe(0).second;
  return statement->fetch() ? statement->value(0, type).toText() : String();
}

tsql::ObjectName readName(const String& text) {
  auto statements = tsql::parse(tsql::tokenize("select * from " + text));
  return std::get<tsql::SelectPtr>(statements.front())->parts.front().core.from.front()->table;
}

}  // namespace

std::vector<String> primaryKey(Connection& connection, const tsql::ObjectName& table, std::chrono::seconds timeout) {
  const auto key = keyOfTable(connection, table, timeout);
  if (!key.empty()) return key;
  const String base = baseOf(connection, table, timeout);
  return base.empty() ? key : keyOfTable(connection, readName(base), timeout);
}

}  // namespace QVSa::odbc
