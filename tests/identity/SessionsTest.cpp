#include "tests/support/Failures.h"
#include "tests/support/Scene.h"

namespace QVSa {
namespace {

using test::failureOf;

// clearSessions is for the library alone; an explicit instantiation may name it all the same.
template <auto Operation>
struct Reach {
  friend Boolean clearSessions(Sessions& sessions, const String& id) { return (sessions.*Operation)(id); }
};
Boolean clearSessions(Sessions& sessions, const String& id);
template struct Reach<&Sessions::clearSessions>;

// Ann is signed on; rule "inv" gives released numbers out again.
class SessionEnd : public test::Scene {
 protected:
  SessionEnd() {
    addUser("ann");
    EXPECT_TRUE(connected<User>().loginAuth("ann", "right", &id_));
    auto rule = connected<IdMgr>();
    rule.idName("inv");
    rule.preFix("I");
    rule.numPlace(3);
    rule.reuseStyle(anyone);
    EXPECT_TRUE(rule.Save());
  }

  String issue(const String& record, const String& session) {
    return connected<IdMgr>().newId("inv", "", -1, record, session);
  }

  String id_;
};

TEST_F(SessionEnd, GivesBackTheNumbersThatTheSessionStillHolds) {
  EXPECT_EQ(issue("r1", id_), "I001");
  EXPECT_EQ(issue("r2", "other"), "I002");
  EXPECT_EQ(issue("r3", id_), "I003");
  // A host that keeps a number takes it out of its session.
  tables_.run("update QVIdDel set sesId=null where rcId='r1'");

  auto sessions = connected<Sessions>();
  ASSERT_EQ(sessions.Count(), 1);
  EXPECT_EQ(sessions.Item(id_)->DBName(), "QVApp");
  EXPECT_TRUE(sessions.Terminate(id_)) << sessions.errDescription();
  EXPECT_EQ(sessions.Count(), 1);
  sessions.GetAll();
  EXPECT_EQ(sessions.Count(), 0);
  EXPECT_EQ(tables_.text("select theId,rcId,sesId,state from idDel order by theId"),
            "I001|r1|-|1\nI002|r2|other|1\nI003|-|-|0");
  EXPECT_EQ(issue("", "other"), "I004") << "without a record nothing is given out again";
  EXPECT_EQ(issue("r4", "other"), "I003");
  EXPECT_EQ(issue("r5", "other"), "I005");
  EXPECT_TRUE(sessions.Terminate("unknown"));
}

TEST_F(SessionEnd, WithoutAnApplicationDatabaseTakesTheSessionAndLeavesTheNumbers) {
  issue("r1", id_);
  Sessions sessions;
  sessions.connect(server());
  EXPECT_EQ(refusal(sessions, sessions.Terminate(id_)), number::noTable);
  EXPECT_EQ(sessions.errDescription(), "Disconnection error.Invalid object name 'QVIdDel'.");
  EXPECT_EQ(tables_.text("select count(*) from seslog"), "0");
  EXPECT_EQ(tables_.text("select rcId,sesId from idDel"), "r1|" + id_);
}

TEST_F(SessionEnd, IsWhatAHostLearnsWhenItMarksActivity) {
  if (test::onServer()) GTEST_SKIP() << test::serversClock;
  clock_.set(Date(2024, 3, 7, 11, 30, 0));
  Long uid = 7;
  Sessions sessions;
  EXPECT_TRUE(sessions.newAction(id_, server(), uid, "", 0)) << sessions.errDescription();
  EXPECT_EQ(tables_.text("select begintime,lastActTime from seslog"), "2024-03-07 10:00:00|2024-03-07 11:30:00");
  connected<Sessions>().Terminate(id_);
  EXPECT_FALSE(sessions.newAction(id_, server(), uid, "", 0));
  EXPECT_EQ(sessions.errNumber(), 0);
}

TEST_F(SessionEnd, ComesForAllOrForAllButOne) {
  if (test::onServer()) GTEST_SKIP() << test::serversClock;
  tables_.run("insert into seslog(sesId,userLogin,computer) values('s2','ben','pc2')");
  auto sessions = connected<Sessions>();
  EXPECT_EQ(sessions.Item("S2"), sessions.Item(2));
  EXPECT_EQ(sessions.Item(1)->BeginTime(), "2024-03-07 10:00:00");
  EXPECT_EQ(sessions.Item(2)->ip(), "");
  EXPECT_EQ(failureOf([&] { sessions.Item(3); }), number::position);
  EXPECT_EQ(failureOf([&] { sessions.Item("none"); }), number::argument);
  sessions.Remove("s2");
  EXPECT_EQ(sessions.Count(), 1);

  EXPECT_TRUE(clearSessions(sessions, id_));
  EXPECT_EQ(tables_.text("select sesId from seslog"), id_);
  EXPECT_TRUE(clearSessions(sessions, ""));
  EXPECT_EQ(tables_.text("select count(*) from seslog"), "0");

  EXPECT_TRUE(sessions.connect(server() + "-gone")) << "the list can be read later";
  EXPECT_EQ(sessions.errNumber(), number::general);
  EXPECT_FALSE(clearSessions(sessions, ""));
}

}  // namespace
}  // namespace QVSa
