#pragma once

#include <gtest/gtest.h>

#include "QVSa/frame/Connection.h"
#include "QVSa/frame/ConnectionString.h"
#include "tests/support/TestInstallation.h"

namespace QVSa::test {

// The databases as they are shipped, spoken to in statements.
class Shipped : public testing::Test {
 protected:
  Connection open(const String& database = "QVSys") {
    Connection connection;
    connection.Open(buildConnString(installation_.server(), database, false));
    return connection;
  }

  void run(const String& batch, const String& database = "QVSys") { open(database).Execute(batch); }

  // The rows of a query, a "|" between the values and "-" for NULL.
  std::vector<String> rows(const String& query, const String& database = "QVSys") {
    Connection connection = open(database);
    Recordset set = connection.Execute(query);
    std::vector<String> result;
    for (const auto& row : set.GetRows()) {
      String line;
      for (const Variant& value : row) line += (&value == &row[0] ? "" : "|") + (value.isNull() ? "-" : value.toText());
      result.push_back(line);
    }
    return result;
  }

 private:
  TestInstallation installation_;
};

using Lines = std::vector<String>;

}  // namespace QVSa::test
