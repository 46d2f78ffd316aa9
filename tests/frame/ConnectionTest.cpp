#include <gtest/gtest.h>
#include <random>

#include "QVSa/frame/Connection.h"
#include "QVSa/frame/ConnectionString.h"
#include "QVSa/frame/DeploymentSecrets.h"
#include "QVSa/values/Text.h"
#include "providers/Provider.h"
#include "tests/support/Failures.h"
#include "tests/support/FakeSession.h"

namespace QVSa {

using test::failureOf;
using test::FakeServer;

namespace {

using Log = std::vector<String>;

Connection opened() {
  Connection connection;
  connection.Open(buildConnString("db1", "QVApp", false));
  return connection;
}

}  // namespace

TEST(Connection, OpensRunsAndCloses) {
  FakeServer server;
  Connection connection;
  EXPECT_EQ(connection.State(), 0);
  connection.Open(buildConnString("db1", "QVApp", false));
  EXPECT_EQ(connection.State(), 1);
  EXPECT_EQ(server.lastOptions.database, "QVApp");
  Long affected = 0;
  EXPECT_EQ(connection.Execute("delete from jobs", &affected).State(), 0);
  EXPECT_EQ(affected, 1);
  EXPECT_EQ(server.lastBatch.timeout, std::chrono::seconds(30));
  connection.CommandTimeout(7200);
  connection.Execute("backup");
  EXPECT_EQ(server.lastBatch.timeout, std::chrono::seconds(7200));
  connection.Close();
  EXPECT_EQ(connection.State(), 0);
  EXPECT_EQ(server.log, (Log{"open", "delete from jobs", "backup", "close"}));
}

TEST(Connection, OutOfPlaceOperationsFail) {
  FakeServer server;
  Connection connection;
  EXPECT_EQ(failureOf([&] { connection.Execute("x"); }), number::closed);
  EXPECT_EQ(failureOf([&] { connection.Close(); }), number::closed);
  EXPECT_EQ(failureOf([&] { connection.BeginTrans(); }), number::closed);
  EXPECT_EQ(failureOf([&] { connection.Open(""); }), number::general);
  connection = opened();
  EXPECT_EQ(failureOf([&] { connection.Open("data source=db2"); }), number::open);
  EXPECT_EQ(failureOf([&] { connection.CommitTrans(); }), number::noTransaction);
  EXPECT_EQ(failureOf([&] { connection.RollbackTrans(); }), number::noTransaction);
  connection.BeginTrans();
  EXPECT_EQ(failureOf([&] { connection.BeginTrans(); }), number::inTransaction);
  connection.CommitTrans();
  connection.Close();
  EXPECT_EQ(server.log, (Log{"open", "begin", "commit", "close"})) << "nothing is left to discard";
  server.fail("open", Failure(number::login, "Provider", "Login failed for user 'QVUser'.", 18456));
  EXPECT_EQ(failureOf([&] { connection.Open("data source=db1"); }), number::login);
  EXPECT_EQ(connection.State(), 0);
}

TEST(Connection, AFailedCommitIsDiscardedByClosingWhateverHappens) {
  FakeServer server;
  server.fail("commit", Failure(number::timeout, "Provider", "Query timeout expired"));
  server.fail("rollback", Failure(number::general, "Provider", "Connection lost"));
  Connection connection = opened();
  connection.BeginTrans();
  EXPECT_EQ(failureOf([&] { connection.CommitTrans(); }), number::timeout);
  connection.Close();
  EXPECT_EQ(server.log, (Log{"open", "begin", "commit", "rollback", "close"}));
  EXPECT_EQ(server.sessions, 0);
}

TEST(Connection, ANewOneInItsPlaceEndsTheOldOne) {
  FakeServer server;
  Connection connection = opened();
  connection.BeginTrans();
  connection = opened();
  EXPECT_EQ(server.log, (Log{"open", "begin", "open", "rollback", "close"}));
  connection.BeginTrans();
  EXPECT_EQ(server.sessions, 1);
}

TEST(ConnectionString, IsBuiltFromServerAndDatabase) {
  EXPECT_EQ(buildConnString("db1", "", false),
            "provider=sqloledb;data source=db1;database=QVSys;uid=QVUser;pwd=" + defaultDbPwd() + ";");
  EXPECT_EQ(buildConnString("db1,1433|" + scrambleText("secret"), "QVApp", false),
            "provider=sqloledb;data source=db1,1433;database=QVApp;uid=QVUser;pwd=secret;");
  EXPECT_EQ(buildConnString("db1,1433|AB", "QVApp", false),
            "provider=sqloledb;data source=db1,1433;database=QVApp;uid=QVUser;pwd=;");
  EXPECT_EQ(serverOnly("a|b|c"), "a");
  EXPECT_EQ(serverOnly("a"), "a");
}

TEST(ConnectionString, OfAnIntegratedLoginHoldsNoPassword) {
  EXPECT_EQ(buildConnString("db1|" + scrambleText("secret"), "", true),
            "PROVIDER=SQLOLEDB;DATA SOURCE=db1;Integrated Security=sspi;DATABASE=QVSys");
  EXPECT_EQ(buildConnString("<pwd>", "", true).find(defaultDbPwd()), String::npos);
}

TEST(ConnectionString, ItsPartsAreReadBack) {
  const ConnectionOptions login = parseConnectionString(buildConnString("file:/srv/qv sa", "QVApp", false));
  EXPECT_EQ(login.provider, "sqloledb");
  EXPECT_EQ(login.dataSource, "file:/srv/qv sa");
  EXPECT_EQ(login.database, "QVApp");
  EXPECT_EQ(login.user, "QVUser");
  EXPECT_EQ(login.password, defaultDbPwd());
  EXPECT_FALSE(login.integrated);

  const ConnectionOptions own = parseConnectionString(buildConnString("db1,1433", "", true));
  EXPECT_EQ(own.dataSource, "db1,1433");
  EXPECT_EQ(own.database, "QVSys");
  EXPECT_TRUE(own.integrated);
}

TEST(ConnectionString, KeywordsHaveAnyCaseAndValuesStandAsTheyAre) {
  const ConnectionOptions options =
      parseConnectionString(" Data Source =h;PWD= a=b ;UID=x; application name=y;INTEGRATED SECURITY=false; ");
  EXPECT_EQ(options.dataSource, "h");
  EXPECT_EQ(options.password, " a=b ");
  EXPECT_EQ(options.user, "x");
  EXPECT_FALSE(options.integrated);
}

TEST(ConnectionString, WithoutADataSourceOrCutShortItIsRefused) {
  for (const char* text : {"", "pwd=x;", "data source=;database=QVSys"})
    EXPECT_EQ(failureOf([&] { parseConnectionString(text); }), number::general) << text;
  for (const char* server : {"file:/srv/a;b", "file:/srv/a;b=c", "file:/srv/a;database=X", "file:/srv/a;data source=h"})
    EXPECT_EQ(failureOf([&] { parseConnectionString(buildConnString(server, "", false)); }), number::general) << server;
}

TEST(Scramble, KnownTextsKeepTheirForm) {
  EXPECT_EQ(scrambleText(""), "");
  EXPECT_EQ(unscrambleText(""), "");
  // 13 * 97 = 4 * 256 + 237
  EXPECT_EQ(scrambleText("a"), "NM@D");
  // 13 * 98 = 4 * 256 + 250, and the carry 4 of the letter before: 254
  EXPECT_EQ(scrambleText("ab"), "NMON@D");
}

TEST(Scramble, EveryTextThatHasAFormIsReadBack) {
  std::mt19937 random(20240229);
  std::uniform_int_distribution<int> length(1, 12);
  std::uniform_int_distribution<int> letter(1, 127);
  int refused = 0;
  for (int round = 0; round < 20000; ++round) {
    String plain(static_cast<std::size_t>(length(random)), ' ');
    for (char& c : plain) c = static_cast<char>(letter(random));
    String scrambled;
    if (failureOf([&] { scrambled = scrambleText(plain); }) != 0) {
      ++refused;
      continue;
    }
    ASSERT_EQ(scrambled.size(), 2 * (plain.size() + 1));
    ASSERT_EQ(scrambled.find_first_not_of("@ABCDEFGHIJKLMNO"), String::npos);
    ASSERT_EQ(unscrambleText(scrambled), plain);
  }
  EXPECT_GT(refused, 0);
  EXPECT_LT(refused, 6000);
}

TEST(Scramble, RefusesWhatNoByteCanCarry) {
  // 13 * 59 = 2 * 256 + 255, and the carry 6 of the letter before goes beyond a byte.
  EXPECT_EQ(failureOf([] { scrambleText("z;"); }), number::argument);
  EXPECT_EQ(scrambleText(";").size(), 4U);
  EXPECT_EQ(failureOf([] { scrambleText("部"); }), number::argument);
}

TEST(Scramble, GarbageIsReadAsGarbage) {
  for (const char* garbage : {"x", "xyz", "zzzzzz", "    ", "部门😀!", "\xFF\xFE\xFD\xFC", "@@@@@@"})
    EXPECT_EQ(failureOf([&] { unscrambleText(garbage); }), 0) << garbage;
}

}  // namespace QVSa
