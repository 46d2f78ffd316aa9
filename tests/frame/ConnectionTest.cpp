#include <gtest/gtest.h>

#include "QVSa/frame/Connection.h"
#include "QVSa/frame/ConnectionString.h"
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

}  // namespace QVSa
