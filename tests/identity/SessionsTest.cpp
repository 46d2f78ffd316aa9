#include <gtest/gtest.h>

#include "QVSa/identity/Sessions.h"
#include "QVSa/resources/Messages.h"
#include "tests/support/Failures.h"
#include "tests/support/FakeSession.h"

namespace QVSa {
namespace {

using test::failureOf;
using test::FakeServer;
using Log = std::vector<String>;

// clearSessions is for the library alone; an explicit instantiation may name it all the same.
template <auto Operation>
struct Reach {
  friend Boolean clearSessions(Sessions& sessions, const String& id) { return (sessions.*Operation)(id); }
};
Boolean clearSessions(Sessions& sessions, const String& id);
template struct Reach<&Sessions::clearSessions>;

const Failure unreachable(number::general, "server", "no server.");

class SessionsTest : public ::testing::Test {
 protected:
  SessionsTest() {
    server_.answer(
        "select * from sesLog",
        {{{"SESID"}, {"userLogin"}, {"ip"}, {"computer"}, {"beginTime"}, {"dbname"}, {"moduName"}, {"lastActTime"}},
         {{"s1", "ann", Variant::null(), "pc1", Date(2024, 3, 7, 8, 30), "QVApp", Variant::null(),
           Date(2024, 3, 7, 9, 0, 5)},
          {"s2", "ben", "10.0.0.5", "pc2", Date(2024, 3, 7), "QVApp", "", ""}}});
  }

  FakeServer server_;
  Sessions sessions_;
};

TEST_F(SessionsTest, ConnectReadsTheListFromTheSystemDatabaseWhateverDatabaseItNames) {
  EXPECT_TRUE(sessions_.connect("host", "QVApp"));
  EXPECT_EQ(server_.lastOptions.database, "QVSys");
  ASSERT_EQ(sessions_.Count(), 2);
  EXPECT_EQ(sessions_.Item("S1"), sessions_.Item(1));
  EXPECT_EQ(sessions_.Item(1)->ip(), "");
  EXPECT_EQ(sessions_.Item(1)->BeginTime(), "2024-03-07 08:30:00");
  EXPECT_EQ(failureOf([&] { sessions_.Item(3); }), number::position);
  EXPECT_EQ(failureOf([&] { sessions_.Item("none"); }), number::argument);
  sessions_.Remove("s1");
  EXPECT_EQ(sessions_.Item(1)->UserLogin(), "ben");
}

TEST_F(SessionsTest, AListThatCannotBeReadLeavesConnectTrueWithAReport) {
  server_.fail("open", unreachable);
  EXPECT_TRUE(sessions_.connect("host"));
  EXPECT_EQ(sessions_.Count(), 0);
  EXPECT_EQ(sessions_.errNumber(), number::general);
  EXPECT_EQ(sessions_.errDescription(), LoadResString(1601) + "no server.");
}

TEST_F(SessionsTest, EndingASessionFreesItsNumbersInTheApplicationDatabase) {
  sessions_.connect("host", "QVApp");
  server_.log.clear();
  EXPECT_TRUE(sessions_.Terminate("s1"));
  EXPECT_EQ(server_.log,
            (Log{"open", "delete from seslog where sesId=N's1'", "use QVApp",
                 "update QVIdDel set rcId=null,sesId=null,state=0 where sesId=N's1'", "use QVSys", "close"}));
  EXPECT_EQ(sessions_.Count(), 2) << "the list is that of the last reading";
}

TEST_F(SessionsTest, WithoutAnApplicationDatabaseTheSessionGoesAndItsNumbersDoNot) {
  sessions_.connect("host");
  server_.log.clear();
  const String release = "update QVIdDel set rcId=null,sesId=null,state=0 where sesId=N's1'";
  server_.fail(release, Failure(number::noTable, "server", "no table."));
  EXPECT_FALSE(sessions_.Terminate("s1"));
  EXPECT_EQ(sessions_.errDescription(), LoadResString(1603) + "no table.");
  EXPECT_EQ(server_.log, (Log{"open", "delete from seslog where sesId=N's1'", release, "close"}));
}

TEST_F(SessionsTest, AllCanBeEndedOrAllButOne) {
  sessions_.connect("host");
  server_.log.clear();
  server_.fail("delete from seslog", unreachable);
  EXPECT_TRUE(clearSessions(sessions_, "s1"));
  EXPECT_FALSE(clearSessions(sessions_, ""));
  EXPECT_EQ(sessions_.errDescription(), LoadResString(1603) + "no server.");
  EXPECT_EQ(server_.log,
            (Log{"open", "delete from seslog where sesId<>N's1'", "close", "open", "delete from seslog", "close"}));
}

TEST_F(SessionsTest, ActivityIsMarkedForASessionThatIsThereAndRefusedInSilenceOtherwise) {
  const String find = "select count(*) from sesLog where sesId=N's1'";
  Long uid = 0;
  server_.answer(find, {{{""}}, {{Long{1}}}});
  EXPECT_TRUE(sessions_.newAction("s1", "host", uid, "", 0));
  EXPECT_EQ(server_.log[2], "update sesLog set lastacttime=getdate() where sesId=N's1'");

  server_.answer(find, {{{""}}, {{Long{0}}}});
  EXPECT_FALSE(sessions_.newAction("s1", "host", uid, "", 0));
  EXPECT_EQ(sessions_.errNumber(), 0);
}

}  // namespace
}  // namespace QVSa
