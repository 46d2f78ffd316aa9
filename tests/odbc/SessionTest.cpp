#include <sys/wait.h>
#include <thread>
#include <unistd.h>

#include "QVSa/identity/User.h"
#include "QVSa/numbering/IdMgr.h"
#include "StrictSession.h"
#include "providers/odbc/WireBatch.h"
#include "tests/support/RecordingProvider.h"
#include "tests/support/TestInstallation.h"

namespace QVSa::odbc {
namespace {

using OdbcSession = StrictSession;

TEST_F(OdbcSession, GivesEachTypeItsKindOfValue) {
  run("create table t(b bit, t tinyint, s smallint, i int, l bigint, f float, d datetime, n nvarchar(20), x blob)");
  run("insert into t values(1, 200, -5, -70000, 7, 1.5, '2024-02-03 04:05:06.789', 'text ', x'00ff')");
  run("insert into t(l) values(5000000000)");
  const auto found = rows("select * from t");
  ASSERT_TRUE(found->next());
  EXPECT_EQ(found->value(0), Variant(true));
  EXPECT_EQ(found->value(1), Variant(Integer{200}));
  EXPECT_EQ(found->value(2), Variant(Integer{-5}));
  EXPECT_EQ(found->value(3), Variant(Long{-70000}));
  EXPECT_EQ(found->value(4), Variant(Long{7}));
  EXPECT_EQ(found->value(5), Variant(1.5));
  EXPECT_EQ(found->value(6).toDate().sqlText(), "20240203 04:05:06");
  EXPECT_EQ(found->value(6).toDate().millisecond(), 789);
  EXPECT_EQ(found->value(7), Variant("text "));
  EXPECT_EQ(found->value(8), Variant(Bytes{0, 255}));
  ASSERT_TRUE(found->next());
  EXPECT_EQ(found->value(4), Variant(5e9));
  for (const std::size_t ordinal : {0U, 2U, 3U, 5U, 6U, 7U, 8U}) EXPECT_TRUE(found->value(ordinal).isNull()) << ordinal;
  EXPECT_FALSE(found->next());
}

TEST_F(OdbcSession, ReadsValuesInAnyOrderAndAgain) {
  const auto found = rows("select 'a' x, 'b' y, 'c' z");
  EXPECT_EQ(found->columns()[2].name, "z");
  EXPECT_THROW(found->value(0), Failure);
  ASSERT_TRUE(found->next());
  EXPECT_EQ(found->value(2), Variant("c"));
  EXPECT_EQ(found->value(0), Variant("a"));
  EXPECT_EQ(found->value(2), Variant("c"));
  EXPECT_THROW(found->value(3), Failure);
}

TEST_F(OdbcSession, ReadsLongTextsAndBytesWhole) {
  // 3 bytes, 4 bytes and 2 bytes of UTF-8; the length puts the surrogate pair on the seam of the first pieces.
  const String unit = "\xE4\xB8\xAD\xF0\x9F\x98\x80\xC3\xA9";
  EXPECT_EQ(value("select char(20013,128512,233)"), Variant(unit));
  for (const int copies : {127, 128, 170, 30000}) {
    String expected;
    for (int i = 0; i < copies; ++i) expected += unit;
    EXPECT_EQ(value("select replace(hex(zeroblob(" + std::to_string(copies) + ")),'00',char(20013,128512,233))"),
              Variant(expected))
        << copies;
  }
  run("create table t(x blob)");
  run("insert into t values(zeroblob(100000))");
  EXPECT_EQ(value("select x from t"), Variant(Bytes(100000)));
  run("update t set x=x''");
  EXPECT_EQ(value("select x from t"), Variant(Bytes()));
}

TEST_F(OdbcSession, CountsTheRowsOfTheLastWrite) {
  run("create table t(i int)");
  EXPECT_EQ(run("insert into t values(1),(2),(3)").affected, 3);
  EXPECT_EQ(run("update t set i=5 where i=99").affected, 0);
  EXPECT_EQ(run("delete from t where i=1;update t set i=i+1").affected, 2);
  EXPECT_EQ(run("select * from t").affected, -1);
}

TEST_F(OdbcSession, RunsWhatStandsBehindARowSetBeforeItReturns) {
  run("create table t(i int)");
  const auto result = run("insert into t values(1),(2);select i from t;delete from t;select 99 z");
  EXPECT_EQ(result.affected, 2);
  EXPECT_EQ(value("select count(*) from t").toLong(), 0);
  EXPECT_EQ(texts(*result.rows), "1 2 ");
  EXPECT_THROW(run("select i from t;insert into nosuch values(1)"), Failure);
}

TEST_F(OdbcSession, KeepsRowsThatWaitWhenAnotherBatchStarts) {
  run("create table t(i int, n nvarchar(20))");
  run("insert into t values(1,'a'),(2,'b'),(3,'c')");
  const auto first = rows("select i,n from t order by i");
  const auto fresh = rows("select i from t where i>1 order by i");
  run("delete from t");
  ASSERT_TRUE(first->next());
  const auto current = rows("select 7 i");
  EXPECT_EQ(first->value(1), Variant("a"));
  EXPECT_EQ(texts(*first), "2 3 ");
  EXPECT_FALSE(first->next());
  EXPECT_EQ(texts(*fresh), "2 3 ");
  EXPECT_EQ(texts(*current), "7 ");
}

TEST_F(OdbcSession, FreesTheConnectionWhenRowsEndOrGo) {
  auto ended = rows("select 1 i");
  EXPECT_TRUE(ended->next());
  EXPECT_FALSE(ended->next());
  auto dropped = rows("select 2 i");
  dropped.reset();
  EXPECT_EQ(value("select 3 i").toLong(), 3);
  EXPECT_FALSE(ended->next());
}

TEST_F(OdbcSession, StreamsASingleSelect) {
  // So many rows that reading them all before the first would take minutes.
  const auto found = rows(
      "select a.name from pragma_function_list a, pragma_function_list b, pragma_function_list c, "
      "pragma_function_list d");
  ASSERT_TRUE(found->next());
  EXPECT_FALSE(found->value(0).toText().empty());
}

TEST_F(OdbcSession, KeepsOrDiscardsATransactionsWrites) {
  run("create table t(i int)");
  session_->begin();
  run("insert into t values(1)");
  const auto open = rows("select i from t");
  session_->commit();
  session_->begin();
  run("insert into t values(2)");
  session_->rollback();
  run("insert into t values(3)");
  session_->begin();
  session_->rollback();
  EXPECT_EQ(texts(*open), "1 ");
  EXPECT_EQ(texts(*rows("select i from t order by i")), "1 3 ");
}

TEST_F(OdbcSession, TellsAStatementsFailureAndGoesOn) {
  run("create table t(i int primary key)");
  try {
    run("selec");
    ADD_FAILURE() << "ran";
  } catch (const Failure& failure) {
    EXPECT_EQ(failure.number(), number::statement);
    EXPECT_NE(failure.description().find("selec"), String::npos);
    EXPECT_NE(failure.description().front(), '[');
  }
  EXPECT_EQ(run("insert into t values(1)").affected, 1);
}

// Behind a deadlock the server has no transaction any more: what is sent next would be committed alone.
TEST_F(OdbcSession, ADeadlocksVictimTakesNothingButARollback) {
  const auto native = [](auto action) {
    try {
      action();
    } catch (const Failure& failure) {
      return failure.native();
    }
    return Long{0};
  };
  run("create table t(i int)");
  EXPECT_EQ(native([&] { run("deadlock"); }), 1205);
  EXPECT_EQ(run("insert into t values(1)").affected, 1) << "outside a transaction there is nothing to lose";
  session_->begin();
  run("insert into t values(2)");
  EXPECT_EQ(native([&] { run("deadlock"); }), 1205);
  EXPECT_EQ(native([&] { run("insert into t values(3)"); }), 3930);
  EXPECT_EQ(native([&] { session_->commit(); }), 3930);
  EXPECT_EQ(native([&] { run("select i from t"); }), 3930);
  session_->rollback();
  EXPECT_EQ(texts(*rows("select i from t")), "1 ");
}

TEST_F(OdbcSession, EndsWithRowsStillOpenAndATransactionToo) {
  session_->begin();
  run("create table t(i int);insert into t values(1),(2)");
  const auto open = rows("select i from t");
  ASSERT_TRUE(open->next());
  session_.reset();
  EXPECT_THROW(open->next(), Failure);
}

class KeptConnections : public StrictSession {
 protected:
  void SetUp() override {
    StrictSession::SetUp();
    session_.reset();
    if (!IsSkipped()) roundTrips();
  }

  // What a session costs that runs one batch: a log-in is one round trip, giving the connection back another one.
  static int cost(const String& text, std::chrono::seconds keep = minute, const String& identity = "QVUser") {
    {
      const auto session = open(keep, identity);
      try {
        session->run({text});
      } catch (const Failure&) {
        // Some are there to fail.
      }
    }
    return roundTrips();
  }

  static constexpr std::chrono::seconds minute{60};
  static constexpr int warm = 2;
  static constexpr int cold = 3;
};

TEST_F(KeptConnections, ServeTheNextSessionOfTheirIdentityAlone) {
  EXPECT_EQ(cost("select 1 i"), cold);
  EXPECT_EQ(cost("select 1 i"), warm);
  EXPECT_EQ(cost("select 1 i", minute, "sa"), cold);
  EXPECT_EQ(cost("select 1 i", std::chrono::seconds(0)), cold - 1) << "neither taken nor given back";
  for (const char* trace : {"set identity_insert t on", "gone", "alter database QVSys set SINGLE_USER"}) {
    cost("select 1 i");
    cost(trace);
    EXPECT_EQ(cost("select 1 i"), cold) << trace;
  }
  std::this_thread::sleep_for(std::chrono::milliseconds(1100));
  EXPECT_EQ(cost("select 1 i"), warm + 1) << "one that was idle is asked first";
  loseConnection();
  std::this_thread::sleep_for(std::chrono::milliseconds(1100));
  EXPECT_EQ(cost("select 1 i"), cold + 1);
  cost("select 1 i", std::chrono::seconds(1));
  std::this_thread::sleep_for(std::chrono::milliseconds(1100));
  EXPECT_EQ(cost("select 1 i"), cold) << "its time was over";
}

TEST_F(KeptConnections, AreGivenBackWithoutATransaction) {
  session_ = open(minute);
  session_->begin();
  session_ = nullptr;
  session_ = open(minute);
  EXPECT_EQ(value("select @@trancount").toLong(), 0);
}

TEST_F(KeptConnections, AreNoneBehindAFork) {
  cost("select 1 i");
  session_ = open(minute);
  const auto rest = rows("select 1 i");
  const pid_t child = fork();
  if (child == 0) {
    session_.reset();
    _exit(roundTrips() == 1 && cost("select 1 i") == cold ? 0 : 1);
  }
  int status = 0;
  ASSERT_EQ(waitpid(child, &status, 0), child);
  EXPECT_EQ(status, 0);
  EXPECT_EQ(texts(*rest), "1 ");
}

// What it costs that the server is far away: the statements of an operation as the embedded engine hears them, each
// with one of its kind in its place. The bounds may only fall.
class RoundTrips : public KeptConnections {
 protected:
  int of(const std::function<bool()>& operation) {
    test::RecordingProvider recorder;
    EXPECT_TRUE(operation());
    for (int times = 0; times < 2; ++times) {  // the second time with kept connections
      roundTrips();
      for (const String& event : recorder.log()) replay(event);
    }
    return roundTrips();
  }

 private:
  void replay(const String& event) {
    if (event.rfind("open ", 0) == 0) {
      session_ = open(minute);
    } else if (event == "close") {
      session_.reset();
    } else if (event == "begin") {
      session_->begin();
    } else if (event == "commit") {
      session_->commit();
    } else if (wireBatch(event).endsWithItsRowSet) {
      rows("select 1 i")->next();
    } else {
      run(wireBatch(event).isNocount ? event : "use QVSys");
    }
  }
};

TEST_F(RoundTrips, AreFewForASignOnAndForANumber) {
  const test::TestInstallation installation;
  User user;
  ASSERT_TRUE(user.connect(installation.server(), "QVApp"));
  user.Name("Ann");
  user.Login("ann");
  user.Pwd("right");
  ASSERT_TRUE(user.Save()) << user.errDescription();
  IdMgr rule;
  ASSERT_TRUE(rule.connect(installation.server(), "QVApp"));
  EXPECT_LE(of([&] { return user.loginAuth("ann", "right"); }), 18);
  EXPECT_LE(of([&] { return !rule.newId("_RC").empty(); }), 6);
}

}  // namespace
}  // namespace QVSa::odbc
