#pragma once

#include "QVSa/frame/Connection.h"
#include "QVSa/frame/ConnectionString.h"

namespace QVSa::test {

using Lines = std::vector<String>;

// A way to the tables past the public classes. Nothing stays open between two calls.
class PlainSession {
 public:
  explicit PlainSession(const String& server, const String& database = "QVApp")
      : connectionString_(buildConnString(server, database, false)) {}

  void run(const String& batch) const { open().Execute(batch); }

  // The rows of a query, a "|" between the values and "-" for NULL.
  Lines rows(const String& query) const {
    Connection connection = open();
    Recordset set = connection.Execute(query);
    Lines result;
    for (const auto& row : set.GetRows()) {
      String line;
      for (const Variant& value : row) line += (&value == &row[0] ? "" : "|") + (value.isNull() ? "-" : value.toText());
      result.push_back(line);
    }
    return result;
  }

  // The rows as one text, one line each.
  String text(const String& query) const {
    String result;
    for (const String& line : rows(query)) result += (result.empty() ? "" : "\n") + line;
    return result;
  }

 private:
  Connection open() const {
    Connection connection;
    connection.Open(connectionString_);
    return connection;
  }

  String connectionString_;
};

}  // namespace QVSa::test
