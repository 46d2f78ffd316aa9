#include "tests/organisation/Company.h"

namespace QVSa {
namespace {

using test::Lines;
using test::names;

class RoleTest : public test::Company {
 protected:
  // All rows that hang on jobs, the jobs that they name and their tables.
  Lines hanging() const {
    return tables_.rows(
        "select jobId,t='a' from userJob where jobId>4 union all select jobId,'b' from cftJob union all select "
        "jobId,'c'"
        " from fldAcl union all select jobId,'d' from repAcl union all select jobId,'e' from userMgr order by t,jobId");
  }
  void hang(Long jobId) {
    const String id = text(jobId);
    tables_.run("insert into userJob(userId,jobId) values(1," + id + ") insert into cftJob(tId,jobId) values(1," + id +
                ") insert into fldAcl(fldId,jobId) values(1," + id + ") insert into repAcl(repId,jobId) values(1," +
                id + ") insert into userMgr(UserId,flag,jobId) values(1,1," + id + ")");
  }
  Lines jobsOf(const Role& role) const {
    return tables_.rows("select d.deptNo from jobs j,departments d where j.deptId=d.deptId and j.roleId=" +
                        text(role.Id()) + " order by d.deptId");
  }
};

TEST_F(RoleTest, AllOfARoleIsStoredAndLoaded) {
  auto clerk = connected<Role>();
  clerk.Name("Clerk");
  clerk.description("Does 'the' work");
  clerk.creUserId(3);
  clerk.creUserName("Ann");
  clerk.createTime(Date(2024, 3, 7, 10, 30, 0));
  clerk.otherCanDesign(true);
  ASSERT_TRUE(clerk.Save()) << clerk.errDescription();
  EXPECT_EQ(tables_.text("select OtherCanUpd,UpdUId,UpdTime from roles where roleName='Clerk'"),
            "-1|0|1900-01-01 00:00:00");
  clerk.updTime(Date(2024, 5, 1));
  clerk.upduserName("Bob");
  clerk.updUserId(4);
  ASSERT_TRUE(clerk.Save()) << clerk.errDescription();

  auto loaded = connected<Role>();
  ASSERT_TRUE(loaded.GetOne(2, "clerk"));
  EXPECT_EQ(loaded.Id(), clerk.Id());
  EXPECT_EQ(loaded.description(), "Does 'the' work");
  EXPECT_EQ(loaded.creUserId(), 3);
  EXPECT_EQ(loaded.creUserName(), "Ann");
  EXPECT_EQ(loaded.createTime(), Date(2024, 3, 7, 10, 30, 0));
  EXPECT_EQ(loaded.updUserId(), 4);
  EXPECT_EQ(loaded.upduserName(), "Bob");
  EXPECT_EQ(loaded.updTime(), Date(2024, 5, 1));
  EXPECT_TRUE(loaded.otherCanDesign());
  EXPECT_FALSE(loaded.builtIn());

  ASSERT_TRUE(loaded.GetOne(1, Long{1}));
  EXPECT_TRUE(loaded.builtIn());
  EXPECT_EQ(loaded.creUserId(), 0);
  EXPECT_EQ(loaded.createTime().days(), 0);
  tables_.run("update roles set roleDesc=null where roleId=1");
  loaded.description("before");
  ASSERT_TRUE(loaded.GetOne(1, Long{1}));
  EXPECT_EQ(loaded.description(), "before");
}

TEST_F(RoleTest, RefusalsTellTheirReason) {
  auto role = connected<Role>();
  for (const Integer key : {Integer{2}, Integer{3}}) {
    EXPECT_EQ(refusal(role, role.GetOne(key, key == 2 ? "Boss" : "Manager")), messageNumber(1201));
  }
  EXPECT_EQ(role.errDescription(), "Undefined role [Manager].");
  EXPECT_EQ(refusal(role, role.Save()), messageNumber(1202));
  role.Name("manager");
  EXPECT_EQ(refusal(role, role.Save()), messageNumber(1209));
  role.Id(999);
  EXPECT_TRUE(role.Save()) << "the update of a role that is not there changes nothing";
  role.Name(String(60, 'x'));
  role.Id(manager_.Id());
  EXPECT_EQ(refusal(role, role.Save()), number::range);
  EXPECT_EQ(role.errDescription().substr(0, 38), "Fail to update the role properties. St");
  role.Id(0);
  EXPECT_FALSE(role.Save());
  EXPECT_EQ(role.errDescription().substr(0, 2), "St");
  EXPECT_EQ(role.Id(), 0);
}

TEST_F(RoleTest, JobsAreMadeAndRemovedWithAllThatHangsOnThem) {
  ASSERT_TRUE(manager_.setJobs(idOf("S") + "," + idOf("E") + ",9999"));
  ASSERT_TRUE(manager_.setJobs(idOf("E") + ", " + idOf("H")));
  EXPECT_EQ(jobsOf(manager_), (Lines{"S", "E", "H"})) << "a job that is there is passed over";
  const Long east = manager_.GetJobIdOfTheDept(idOf("E"));
  hang(east);
  hang(manager_.GetJobIdOfTheDept(idOf("H")));

  ASSERT_TRUE(manager_.setJobs("", ""));
  ASSERT_TRUE(manager_.setJobs(idOf("W"), idOf("H") + "," + idOf("W")));
  EXPECT_EQ(jobsOf(manager_), (Lines{"S", "E"})) << "an id in both lists loses its job";
  const String id = text(east);
  EXPECT_EQ(hanging(), (Lines{id + "|a", id + "|b", id + "|c", id + "|d", id + "|e"}));

  EXPECT_EQ(manager_.GetJobIdOfTheDept(idOf("H")), 0);
  EXPECT_EQ(manager_.errNumber(), messageNumber(1210));
}

TEST_F(RoleTest, ADeletedRoleTakesItsJobsAlong) {
  hang(job(manager_, "E"));
  ASSERT_TRUE(manager_.Delete());
  EXPECT_EQ(hanging(), Lines{});
  EXPECT_EQ(tables_.text("select count(*) from roles where roleName='Manager'"), "0");
  EXPECT_EQ(tables_.text("select count(*) from jobs where jobId>4"), "0");
  EXPECT_TRUE(manager_.Delete(4711));
}

TEST_F(RoleTest, HoldersComeDirectlyOrThroughAGroup) {
  addUser("ann", "E", text(job(manager_, "H")));
  const Long bob = addUser("bob", "W");
  addGroup("Deputies", text(bob), "Manager");
  addUser("cleo", "W");
  tables_.run("update users set isAbstract=1 where userName='ann'");

  EXPECT_EQ(names(*manager_.GetUsers()), (Lines{"bob"}));
  EXPECT_EQ(names(*manager_.GetUsers(false, false)), (Lines{"ann", "bob"}));
  EXPECT_EQ(names(*manager_.GetUsers(true, false, "E")), (Lines{"ann"}));
  EXPECT_EQ(names(*manager_.GetUsersOfRole(idOf("S"), "Manager")), (Lines{"ann"}));
  EXPECT_EQ(names(*manager_.GetUsersOfRole("", "manager")), (Lines{"ann", "bob"}));

  tables_.run(
      "insert into users(userName,userLogin,deptId) select userName,'twin',deptId from users where userName='bob'"
      " insert into grpUser(gId,userId) select gId,userId from ItemGroups,users where userLogin='twin'");
  EXPECT_EQ(manager_.GetUsers(true, false), nullptr) << "two of one name";
  EXPECT_EQ(manager_.errNumber(), number::keyExists);
  EXPECT_EQ(names(*manager_.GetUsersOfRole("", "Manager")), (Lines{"ann", "bob"}));

  EXPECT_EQ(manager_.GetUsersOfRole("40000"), nullptr);
  EXPECT_EQ(manager_.errNumber(), number::overflow);
  EXPECT_EQ(manager_.errDescription(), "Error in listing users who have the role [Manager]. Overflow");
}

TEST_F(RoleTest, HoldersAreAddedAndRemovedByPairsAndTellTheirJobsAsXml) {
  String xml = "before";
  ASSERT_TRUE(manager_.GetUsers2(xml));
  EXPECT_EQ(xml, "<users/>");
  const String hub = text(job(manager_, "H")), works = text(job(manager_, "W"));
  const String ann = text(addUser("A <&> \"B\"\x07\n", "E"));
  ASSERT_TRUE(manager_.UpdateUsers(ann + "," + hub + "|" + ann + "," + works, ""));
  ASSERT_TRUE(manager_.GetUsers2(xml));
  const String start = "<user id=\"" + ann + "\" name=\"A &lt;&amp;> &quot;B&quot;&#10;\" deptid=\"" + idOf("E") +
                       "\" deptname=\"East\" jobid=\"";
  EXPECT_EQ(xml, "<users>" + start + hub + "\" deptno=\"E\"/>" + start + works + "\" deptno=\"E\"/></users>");

  EXPECT_TRUE(manager_.UpdateUsers("", ""));
  EXPECT_EQ(refusal(manager_, manager_.UpdateUsers(ann + "," + works + "|" + ann + "," + hub, ann + "," + hub)),
            number::integrity);
  EXPECT_EQ(tables_.rows("select jobId from userJob where userId=" + ann), (Lines{works}))
      << "what was removed stays so";
  EXPECT_EQ(refusal(manager_, manager_.UpdateUsers("7", "")), number::position);
}

TEST_F(RoleTest, TheReachIsWhatReportsAndTasksGive) {
  EXPECT_EQ(manager_.getAcl(), "");
  EXPECT_EQ(manager_.errNumber(), 0);
  const String hub = text(job(manager_, "H"));
  tables_.run(
      "insert into reports(repId,repName) values(4,'Sales report') insert into reports(repId,repName) values(9,'O <1>')"
      "insert into repAcl(repId,jobId,authType) values(4," +
      hub +
      ",1)"
      "insert into repTmps(rtUid,repId) values('t',9) insert into cfprocesses(pId,rtUid) values(2,'t')"
      "insert into cftasks(tId,pId,tName) values(3,2,'Approve') insert into cftJob(tId,jobId) values(3," +
      hub + ")");
  const String expected =
      "<acl><rep id=\"4\" name=\"Sales report\" authType=\"1\" tName=\"\"/>"
      "<rep id=\"9\" name=\"O &lt;1>\" authType=\"3\" tName=\"Approve\"/></acl>";
  EXPECT_EQ(manager_.getAcl(), expected);
  EXPECT_EQ(connected<Role>().getAcl(manager_.Id()), expected);
}

}  // namespace
}  // namespace QVSa
