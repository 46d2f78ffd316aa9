#include "tests/organisation/Company.h"
#include "tests/support/FakeSession.h"
#include "tests/support/RecordingProvider.h"

namespace QVSa {
namespace {

using test::Lines;

// Sales has the inner id 3, East 4, Hub 5 and Works 6.
class DepartmentTree : public test::Company {
 protected:
  void change(const String& id, const std::function<void(Department&)>& change) {
    Department changed = department(id);
    change(changed);
    ASSERT_TRUE(changed.Save()) << changed.errDescription();
  }
  void move(const String& id, const String& super) {
    change(id, [&](Department& moved) { moved.Super(super); });
  }
  void expectRefused(Department& subject, Boolean result, Long message) {
    EXPECT_FALSE(result);
    EXPECT_EQ(subject.errNumber(), messageNumber(message)) << subject.errDescription();
  }
  Lines tree() const {
    return tables_.rows("select deptNo,path,fullName from departments where deptId>2 order by deptId");
  }
};

TEST_F(DepartmentTree, GrowsWithPathsAndFullNamesThatLeaveOutTheRoot) {
  addDepartment("T", " Top ", "");
  EXPECT_EQ(tree(), (Lines{"S|.1.3.|Sales", "E|.1.3.4.|Sales-East", "H|.1.3.4.5.|Sales-East-Hub", "W|.1.6.|Works",
                           "T|.7.|Top"}));
  const Department hub = department("h");
  EXPECT_EQ(hub.InnerId(), 5);
  EXPECT_EQ(hub.Super(), "E");
  EXPECT_EQ(hub.superInnerId(), 4);
  EXPECT_EQ(hub.fullId(), ".1.3.4.5.");
  auto same = connected<Department>();
  EXPECT_TRUE(same.GetOne(2, "hub"));
  EXPECT_TRUE(same.GetOne(3, "5"));
}

TEST_F(DepartmentTree, AMoveOrANewNameGoesThroughAllThatLiesBelow) {
  move("E", "W");
  EXPECT_EQ(tree(), (Lines{"S|.1.3.|Sales", "E|.1.6.4.|Works-East", "H|.1.6.4.5.|Works-East-Hub", "W|.1.6.|Works"}));
  EXPECT_EQ(tables_.text("select superDept from departments where deptNo='E'"), "6");
  change("E", [](Department& east) { east.Name("West"); });
  EXPECT_EQ(tree(), (Lines{"S|.1.3.|Sales", "E|.1.6.4.|Works-West", "H|.1.6.4.5.|Works-West-Hub", "W|.1.6.|Works"}));
  move("E", "");
  EXPECT_EQ(tree()[1], "E|.4.|West");
  EXPECT_EQ(tree()[2], "H|.4.5.|West-Hub");
  move("E", "_root");
  EXPECT_EQ(tree()[2], "H|.1.4.5.|West-Hub");
}

TEST_F(DepartmentTree, ARefusedSaveChangesNothing) {
  const Lines before = tree();
  auto empty = connected<Department>();
  empty.Id("X");
  expectRefused(empty, empty.Save(), 1002);
  empty.Name("X");
  empty.Super("nowhere");
  expectRefused(empty, empty.Save(), 1003);

  Department east = department("E");
  east.Super("nowhere");
  expectRefused(east, east.Save(), 1003);
  east.Name("");
  expectRefused(east, east.Save(), 1002);
  EXPECT_EQ(tree(), before);
}

TEST_F(DepartmentTree, WhetherItIsForOutsidersIsWrittenOnce) {
  change("E", [](Department& east) {
    east.isOuter(true);
    east.isOrg(true);
  });
  EXPECT_EQ(tables_.text("select isOuter,isOrg from departments where deptNo='E'"), "0|1");
  EXPECT_EQ(department("H").Org(), "E");
  EXPECT_EQ(department("E").Org(), "E");
  EXPECT_EQ(department("W").Org(), "_root");
}

TEST_F(DepartmentTree, NullsInTheColumnsOfTheTree) {
  tables_.run("update departments set superDept=null where deptNo='W'");
  EXPECT_TRUE(department("W").isOrg()) << "nothing above it";
  tables_.run("update departments set isOrg=null where deptNo='W'");
  EXPECT_FALSE(department("W").isOrg());
  EXPECT_EQ(department("W").Super(), "");

  tables_.run("update departments set path=null where deptNo='E'");
  auto east = connected<Department>();
  EXPECT_EQ(refusal(east, east.GetOne(1, "E")), number::nullUse);
  EXPECT_EQ(east.Name(), "East") << "the fields are there";
  expectRefused(east, east.GetOne(1, "nowhere"), 1001);
  EXPECT_EQ(east.Org(), "_root");
  addDepartment("N", "New", "E");
  EXPECT_EQ(tree().back(), "N|7.|Sales-East-New");
  tables_.run("update departments set fullName=null where deptNo='E'");
  addDepartment("M", "More", "E");
  EXPECT_EQ(tree().back(), "M|8.|");
}

TEST_F(DepartmentTree, ADepartmentWithoutAPathIsSavedAloneAndGetsItsPath) {
  auto added = connected<Department>();
  added.Id("N");
  added.Name("New");
  added.Super("E");
  {
    test::RecordingProvider recorder;
    recorder.failAt(6, Failure(number::timeout, "server", "late."));
    ASSERT_FALSE(added.Save());
    EXPECT_EQ(recorder.log().back(), "close");
  }
  EXPECT_EQ(tree().back(), "N|-|Sales-East-New");
  Lines expected = tree();
  added.Name("Newer");
  ASSERT_TRUE(added.Save()) << added.errDescription();
  expected.back() = "N|.1.3.4.7.|Sales-East-Newer";
  EXPECT_EQ(tree(), expected);

  // Below one without a path it can be no better off, but it can be moved away again with all that it has below it.
  tables_.run("update departments set path=null where deptNo='W'");
  move("E", "W");
  EXPECT_EQ(tree(), (Lines{"S|.1.3.|Sales", "E|4.|Works-East", "H|4.5.|Works-East-Hub", "W|-|Works",
                           "N|4.7.|Works-East-Newer"}));
  move("E", "S");
  expected[3] = "W|-|Works";
  EXPECT_EQ(tree(), expected);
}

TEST_F(DepartmentTree, ADeleteIsRefusedWhileSomebodyIsLeftAndTakesTheJobs) {
  addUser("ann", "E");
  addUser("ben", "H");
  auto subject = connected<Department>();
  expectRefused(subject, subject.Delete("nowhere"), 1001);
  expectRefused(subject, subject.Delete("E"), 1004);
  expectRefused(subject, subject.Delete("H"), 1006);

  // Job 5 is the one of the department that goes, job 1 one that stays.
  tables_.run("delete from users where userLogin='ben' insert into jobs(roleId,deptId) values(1,5)");
  for (const char* hanging : {"userJob(jobId,userId) select jobId,9", "repAcl(jobId,repId) select jobId,1",
                              "userMgr(jobId,flag,UserId) select jobId,1,9", "fldAcl(jobId,fldId) select jobId,1",
                              "cftJob(jobId,tId) select jobId,1"})
    tables_.run(String("insert into ") + hanging + " from jobs where jobId in (1,5)");
  EXPECT_TRUE(subject.Delete("H")) << subject.errDescription();
  for (const char* table : {"jobs", "userJob", "userMgr", "repAcl", "fldAcl", "cftJob"})
    EXPECT_EQ(tables_.text(String("select distinct jobId from ") + table + " where jobId in (1,5)"), "1") << table;
  EXPECT_EQ(tree().size(), 3U);
}

TEST_F(DepartmentTree, ADepartmentTooDeepForItsPathIsNotInserted) {
  tables_.run("update departments set path=replicate('.1',424)+'.' where deptNo='H'");
  auto deep = connected<Department>();
  deep.Id("D");
  deep.Name("Deep");
  deep.Super("H");
  EXPECT_EQ(refusal(deep, deep.Save()), number::range);
  EXPECT_EQ(deep.InnerId(), 0);
}

template <class Object>
Object refusedNew(Long errNumber) {
  Object object;
  object.connect("host");
  if constexpr (std::is_same_v<Object, Department>) object.Id("N");
  if constexpr (std::is_same_v<Object, User>) object.Login("n");
  object.Name("N");
  EXPECT_FALSE(object.Save());
  EXPECT_EQ(object.errNumber(), errNumber);
  return object;
}

TEST(ANewRow, WhoseIdCantBeReadOrThatIsNotCommittedHasNone) {
  const String identity = "select scope_identity()";
  test::FakeServer server;
  server.answer("select count(*) from roles where roleName=N'N'", {{{""}}, {{Long{0}}}});
  server.answer("select count(*) from ItemGroups where gName=N'N'", {{{""}}, {{Long{0}}}});
  server.answer("select * from saferule where id=1", {{{"minLen"}}, {}});
  server.answer("select * from departments where deptNo=N'_root'",
                {{{"deptId"}, {"deptName"}, {"fullName"}}, {{Long{1}, "Us", "Us"}}});
  server.answer(identity, {{{""}}, {}});
  EXPECT_EQ(refusedNew<Department>(messageNumber(1103)).InnerId(), 0);
  EXPECT_EQ(refusedNew<User>(messageNumber(1103)).Id(), 0);
  EXPECT_EQ(refusedNew<Role>(messageNumber(1203)).Id(), 0);
  EXPECT_EQ(refusedNew<userGroup>(messageNumber(1802)).Id(), 0);
  EXPECT_EQ(std::count(server.log.begin(), server.log.end(), "commit"), 0);

  server.answer(identity, {{{""}}, {{9.0}}});
  server.fail("commit", Failure(number::timeout, "server", "late."));
  EXPECT_EQ(refusedNew<User>(number::timeout).Id(), 0);
  EXPECT_EQ(refusedNew<Role>(number::timeout).Id(), 0);
  EXPECT_EQ(refusedNew<userGroup>(number::timeout).Id(), 0);
}

}  // namespace
}  // namespace QVSa
