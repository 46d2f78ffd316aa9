#include <gtest/gtest.h>

#include "providers/odbc/Driver.h"

namespace QVSa::odbc {
namespace {

ConnectionOptions options(const String& dataSource) {
  ConnectionOptions result;
  result.dataSource = dataSource;
  result.database = "QVSys";
  result.user = "QVUser";
  result.password = "p;w}d";
  return result;
}

TEST(Driver, IsTheWantedOneElseMicrosoftsNewestElseFreeTds) {
  const std::vector<String> all{"FreeTDS", "ODBC Driver 17 for SQL Server", "ODBC Driver 18 for SQL Server"};
  const String library = "/lib/odbc/libtdsodbc.so";
  EXPECT_EQ(chooseDriver("", all, library).name, "ODBC Driver 18 for SQL Server");
  EXPECT_EQ(chooseDriver("", {all[0], all[1]}, library).name, "ODBC Driver 17 for SQL Server");
  EXPECT_EQ(chooseDriver("", {"SQLite3", "FreeTDS"}, library).name, "FreeTDS");
  EXPECT_EQ(chooseDriver("", {"SQLite3"}, library).name, library);
  EXPECT_EQ(chooseDriver("Mine", all, library).name, "Mine");
  EXPECT_THROW(chooseDriver("", {"SQLite3"}, ""), Failure);
}

TEST(Driver, IsKnownAsFreeTdsByItsNameOrItsLibrary) {
  EXPECT_TRUE(chooseDriver("FreeTDS", {}, "").freeTds);
  EXPECT_TRUE(chooseDriver("/opt/x/libtdsodbc.so.0", {}, "").freeTds);
  EXPECT_FALSE(chooseDriver("/opt/tds/libmsodbcsql-18.so", {}, "").freeTds);
}

TEST(ConnectionText, IsWrittenAsEachDriverReadsIt) {
  EXPECT_EQ(connectionText(options("db1,1433"), {"ODBC Driver 18 for SQL Server", false}),
            "Driver={ODBC Driver 18 for SQL Server};Server=db1,1433;Database={QVSys};UID={QVUser};PWD={p;w}}d};"
            "Encrypt=yes;TrustServerCertificate=yes;");
  EXPECT_EQ(connectionText(options("db1,1433"), {"FreeTDS", true}),
            "Driver={FreeTDS};Server=db1;Port=1433;Database={QVSys};UID={QVUser};PWD={p;w}d};"
            "TDS_Version=7.4;ClientCharset=UTF-8;");
  EXPECT_NE(connectionText(options("db1\\x"), {"FreeTDS", true}).find("Server=db1\\x;Database="), String::npos);
}

TEST(ConnectionText, HasNeitherUserNorPasswordWithIntegratedSecurity) {
  auto integrated = options("db1");
  integrated.integrated = true;
  const String text = connectionText(integrated, {"FreeTDS", true});
  EXPECT_NE(text.find("Trusted_Connection=yes;"), String::npos);
  EXPECT_EQ(text.find("UID"), String::npos);
  EXPECT_EQ(text.find("PWD"), String::npos);
}

TEST(ConnectionText, RefusesWhatWouldSmuggleInASetting) {
  EXPECT_THROW(connectionText(options("db1;Encrypt=no"), {"ODBC Driver 18 for SQL Server", false}), Failure);
  auto hidden = options("db1");
  hidden.password = "x};Server={db2";
  EXPECT_THROW(connectionText(hidden, {"FreeTDS", true}), Failure);
  EXPECT_NE(connectionText(hidden, {"Other", false}).find("PWD={x}};Server={db2};"), String::npos);
}

}  // namespace
}  // namespace QVSa::odbc
