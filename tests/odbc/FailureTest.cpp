#include <gtest/gtest.h>

#include "providers/odbc/Failure.h"

namespace QVSa::odbc {
namespace {

const String server = "[Microsoft][ODBC Driver 18 for SQL Server][SQL Server]";

TEST(OdbcFailure, TakesItsNumberFromTheServersOwn) {
  const Failure told = failure({{"01000", 3621, server + "The statement has been terminated."},
                                {"23000", 2627, server + "Violation of PRIMARY KEY constraint 'x'."},
                                {"42000", 102, server + "Incorrect syntax near 'y'."}});
  EXPECT_EQ(told.number(), number::integrity);
  EXPECT_EQ(told.native(), 2627);
  EXPECT_EQ(told.description(), "Violation of PRIMARY KEY constraint 'x'.");
  EXPECT_EQ(failure({{"42S02", 208, "Invalid object name 'x'."}}).number(), number::noTable);
  EXPECT_EQ(failure({{"40001", 1205, "Deadlock"}}).number(), number::general);
  const Failure noDatabase = failure({{"08004", 911, "Database 'x' does not exist."}});
  EXPECT_EQ(noDatabase.number(), number::statement);
  EXPECT_EQ(noDatabase.native(), 911);
}

TEST(OdbcFailure, TakesItsNumberFromTheStateWhereADriverSpeaks) {
  EXPECT_EQ(failure({{"HYT00", 0, "Query timeout expired"}}).number(), number::timeout);
  EXPECT_EQ(failure({{"HYT00", 20003, "Timeout expired"}}).number(), number::timeout);
  for (const Diagnostic& lost : {Diagnostic{"08S01", 104, "Communication link failure"},
                                 {"01000", 20017, "Unexpected EOF from the server"},
                                 {"HY000", 20047, "Unknown error"}}) {
    EXPECT_EQ(failure({lost}).number(), number::general);
    EXPECT_EQ(failure({lost}).native(), 0);
    EXPECT_EQ(failure({lost}).description(), "The connection to the server is lost.");
  }
  EXPECT_EQ(failure({{"22001", 0, "String data, right truncation"}}).number(), number::range);
  EXPECT_EQ(failure({{"22018", 0, "Invalid character value"}}).number(), number::conversion);
  EXPECT_THROW(failure({{"HY001", 0, "Memory allocation error"}}), std::bad_alloc);
  EXPECT_EQ(failure({{"HY000", 0, "Connection is busy"}}).number(), number::general);
  EXPECT_EQ(failure({}).number(), number::general);
}

TEST(OdbcFailure, OfConnectingTellsARefusedLogInFromAServerOutOfReach) {
  const Diagnostic link{"08001", 0, "[FreeTDS][SQL Server]Unable to connect to data source"};
  const Failure refused = connectFailure({link, {"28000", 18452, "[FreeTDS][SQL Server]Login failed."}}, "secret");
  EXPECT_EQ(refused.number(), number::login);
  EXPECT_EQ(refused.native(), 18452);
  EXPECT_EQ(connectFailure({{"42000", 4060, "Cannot open database"}, link}, "secret").number(), number::login);

  for (const char* state : {"08001", "HYT00"}) {
    const Failure away = connectFailure({{state, 20009, "[FreeTDS][SQL Server]Unable to connect"}}, "secret");
    EXPECT_EQ(away.number(), number::general);
    EXPECT_EQ(away.native(), 17);
    EXPECT_EQ(away.description(), "Unable to connect");
  }
  EXPECT_EQ(connectFailure({link, {"01000", 20013, "[FreeTDS]Unknown host machine name."}}, "").description(),
            "Unknown host machine name.");
}

TEST(OdbcFailure, OfConnectingRepeatsNoPasswordAndNoConnectionString) {
  EXPECT_EQ(connectFailure({{"HY000", 0, "Bad value 'secret' "}}, "secret").description().find("secret"), String::npos);
  EXPECT_EQ(connectFailure({{"HY000", 0, "In Server=a;Pwd={x}"}}, "secret").description().find("Pwd"), String::npos);
}

}  // namespace
}  // namespace QVSa::odbc
