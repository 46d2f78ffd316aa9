#include "QVSa/hosting/UserKeeping.h"
#include "tests/support/RecordingProvider.h"
#include "tests/support/Scene.h"

namespace QVSa::test {
namespace {

class UserKept : public Scene {
 protected:
  // Ann is locked, holds a job and is in two groups, in one of them with Bob.
  void SetUp() override {
    addUser("ann", [](User& user) { user.setJobs("2"); });
    addUser("bob");
    tables_.run(
        "insert into itemGroups(gName) select 'one' union all select 'two, more'"
        " insert into grpUser(userId,gId) select userId,gId from users,itemGroups where userLogin='ann'"
        " insert into grpUser(userId,gId) select userId,1 from users where userLogin='bob'"
        " update users set accstate=1,lgts=3,lockDate='20240305',pwdDate='20240301' where userLogin='ann'");
  }
  String ann() const {
    return tables_.text("select email,accstate,lgts,lockDate,pwdDate from users where userLogin='ann'");
  }
  String memberships() const {
    return tables_.text("select userLogin,gId from users u,grpUser g where u.userId=g.userId order by userLogin,gId");
  }
  String jobs() const {
    return tables_.text("select jobId from userJob j,users u where j.userId=u.userId and userLogin='ann'");
  }
};

TEST_F(UserKept, ASaveChangesWhatWasSetAndNothingElse) {
  User user = loaded("ann");
  user.Email("a@x");
  auto keeping = connected<UserKeeping>();
  {
    // Somebody leaves a group while Ann is out of it.
    RecordingProvider meanwhile;
    meanwhile.beforeEach([&](const String& event) {
      if (event.rfind("insert into grpUser", 0) == 0) tables_.run("delete from grpUser where gId=1");
    });
    ASSERT_TRUE(keeping.save(user)) << keeping.errDescription();
  }
  EXPECT_EQ(ann(), "a@x|1|3|2024-03-05 00:00:00|2024-03-01 00:00:00");
  EXPECT_EQ(memberships(), "ann|1\nann|2");
  EXPECT_EQ(jobs(), "2");
  EXPECT_EQ(user.grpName(), "one,two, more");
  EXPECT_TRUE(user.locked());

  user.Pwd("another");
  ASSERT_TRUE(keeping.save(user, true)) << keeping.errDescription();
  EXPECT_EQ(ann(), "a@x|1|3|2024-03-05 00:00:00|2024-03-07 10:00:00") << "a new password begins its time";

  RecordingProvider broken;
  broken.beforeEach([](const String& event) {
    if (event.rfind("insert into grpUser", 0) == 0) throw Failure(number::timeout, "SQL Server", "Timeout expired");
  });
  EXPECT_FALSE(keeping.save(user));
  EXPECT_EQ(keeping.errDescription().rfind("The user is saved, but", 0), 0U) << keeping.errDescription();
}

TEST_F(UserKept, AnUnlockForgetsTheFailedSignOnsAndTouchesNothingElse) {
  savePolicy([](safeRule& rule) {
    rule.lockErr(true);
    rule.errTimes(3);
  });
  auto keeping = connected<UserKeeping>();
  ASSERT_TRUE(keeping.unlock(loaded("ann").Id())) << keeping.errDescription();
  EXPECT_EQ(ann(), "|0|0|-|2024-03-01 00:00:00");
  EXPECT_EQ(memberships() + jobs(), "ann|1\nann|2\nbob|12");
  auto user = connected<User>();
  user.loginAuth("ann", "wrong");
  EXPECT_EQ(user.errNumber(), messageNumber(1106)) << "one mistake locks no account again";

  tables_.run("update users set accstate=2 where userLogin='ann'");
  EXPECT_FALSE(keeping.unlock(loaded("ann").Id())) << "that is the audit's affair";
  EXPECT_EQ(keeping.errNumber(), messageNumber(1101));
}

}  // namespace
}  // namespace QVSa::test
