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

// What the catalogue of a table's database knows of its key, or of the synonym that stands for it.
struct Known {
  std::vector<String> key;
  String base;  // of a synonym: "[database].[owner].[name]"
};

Known askCatalogue(Connection& connection, const tsql::ObjectName& object, std::chrono::seconds timeout) {
  const String catalogue = object.database.empty() ? "" : tsql::printName(object.database) + ".";
  const String id = "object_id(" + literal(objectText(object)) + ")";
  const auto statement = connection.statement(timeout);
  statement->execute("select c.name,null from " + catalogue + "sys.indexes i inner join " + catalogue +
                     "sys.index_columns x on x.object_id=i.object_id and x.index_id=i.index_id inner join " +
                     catalogue +
                     "sys.columns c on c.object_id=x.object_id and c.column_id=x.column_id where i.object_id=" + id +
                     " and i.is_primary_key=1 union all select null,base_object_name from " + catalogue +
                     "sys.synonyms where object_id=" + id);
  const ColumnType text = statement->describe(0).second;
  Known known;
  while (statement->fetch()) {
    const Variant column = statement->value(0, text);
    if (column.isNull())
      known.base = statement->value(1, text).toText();
    else
      known.key.push_back(column.toText());
  }
  return known;
}

tsql::ObjectName readName(const String& text) {
  auto statements = tsql::parse(tsql::tokenize("select * from " + text));
  return std::get<tsql::SelectPtr>(statements.front())->parts.front().core.from.front()->table;
}

// A name without a database is one of the synonym's own, not of the session's.
tsql::ObjectName baseOf(const Known& synonym, const tsql::ObjectName& name) {
  tsql::ObjectName base = readName(synonym.base);
  if (base.database.empty()) base.database = name.database;
  return base;
}

}  // namespace

std::vector<String> primaryKey(Connection& connection, const tsql::ObjectName& table, std::chrono::seconds timeout) {
  Known known = askCatalogue(connection, table, timeout);
  if (known.base.empty()) return known.key;
  return askCatalogue(connection, baseOf(known, table), timeout).key;
}

}  // namespace QVSa::odbc
