#include <gtest/gtest.h>

#include "QVSa/organisation/Department.h"
#include "QVSa/organisation/Role.h"
#include "QVSa/organisation/userGroup.h"
#include "QVSa/resources/Messages.h"
#include "tests/support/FakeSession.h"

namespace QVSa {
namespace {

using test::FakeServer;
using test::FakeTable;
using Log = std::vector<String>;

const char* const readEast =
    "select d1.*,superNo=d2.deptNo  from departments d1,departments d2 where d1.superDept*=d2.deptId"
    " and d1.deptNo=N'E'";

String readOrganisation(const String& path, Long deptId) {
  return "select deptId,deptName,fullName,deptNo from departments where (" + path +
         " like '%'+path+'%' and isOrg=1 and deptId<>" + text(deptId) + ") or deptNo='_root' order by path desc";
}

FakeTable row(const Variant& superDept, const Variant& superNo, const Variant& isOrg, const Variant& path) {
  return {{{"deptId"},
           {"deptNo"},
           {"deptName"},
           {"superDept"},
           {"superNo"},
           {"fullname"},
           {"isOrg"},
           {"path"},
           {"isOuter"}},
          {{Long{7}, "E", "East", superDept, superNo, "Sales-East", isOrg, path, Long{1}}}};
}

FakeTable organisation(const char* deptNo) {
  return {{{"deptId"}, {"deptName"}, {"fullName"}, {"deptNo"}}, {{Long{1}, "Group", "Group", deptNo}}};
}

class DepartmentTest : public ::testing::Test {
 protected:
  DepartmentTest() {
    server_.answer(readEast, row(Long{3}, "S", Integer{0}, ".1.3.7."));
    server_.answer(readOrganisation("N'.1.3.7.'", 7), organisation("S"));
    east_.connect("host");
  }

  void answerStored() {
    server_.answer(
        "select d1.path,d1.fullName,superNo=d2.deptNo,superFullName=d2.fullName,d1.deptName"
        " from departments d1,departments d2 where d1.deptId=7 and d1.superDept*=d2.deptId",
        {{{"path"}, {"fullName"}, {"superNo"}, {"superFullName"}, {"deptName"}},
         {{".1.3.7.", "Sales-East", "S", "Sales", "East"}}});
  }
  void answerSuper(const char* number, const Variant& path, const Variant& fullName) {
    server_.answer("select deptId,path,fullName,deptNo from departments where deptNo=N'" + String(number) + "'",
                   {{{"deptId"}, {"path"}, {"fullName"}, {"deptNo"}}, {{Long{5}, path, fullName, number}}});
  }

  FakeServer server_;
  Department east_;
};

TEST_F(DepartmentTest, ARowAtTheTopIsNoOrganisationWhereItsColumnIsNull) {
  server_.answer(readEast, row(Variant::null(), Variant::null(), Variant::null(), ".7."));
  server_.answer(readOrganisation("N'.7.'", 7), organisation("_root"));
  ASSERT_TRUE(east_.GetOne(1, "E"));
  EXPECT_FALSE(east_.isOrg());
  EXPECT_TRUE(east_.isOuter());
}

TEST_F(DepartmentTest, AMoveRewritesTheSubtreeInTheSameTransaction) {
  ASSERT_TRUE(east_.GetOne(1, "E"));
  answerStored();
  answerSuper("O", ".1.5.", "Overseas ");
  east_.Super("O");
  server_.log.clear();
  ASSERT_TRUE(east_.Save());
  EXPECT_EQ(east_.fullName(), "Overseas-East");
  EXPECT_EQ(Log(server_.log.begin() + 4, server_.log.end()),
            (Log{"begin",
                 "update departments set deptNo=N'E',deptName=N'East',fullName=N'Overseas-East',path=N'.1.5.7.',"
                 "superDept=5,isOrg=0 where deptId=7",
                 "update departments set path=replace(path,N'.1.3.7.',N'.1.5.7.'),"
                 "fullName=replace(fullName,N'Sales-East',N'Overseas-East') where path like N'.1.3.7.%' and deptId<>7",
                 "commit", "close"}));
}

TEST_F(DepartmentTest, AnUnchangedDepartmentIsWrittenWithoutItsSubtreeAndARenamedOneWithIt) {
  ASSERT_TRUE(east_.GetOne(1, "E"));
  answerStored();
  server_.log.clear();
  ASSERT_TRUE(east_.Save());
  EXPECT_EQ(server_.log.size(), 7U);

  east_.Name("West");
  server_.log.clear();
  ASSERT_TRUE(east_.Save());
  EXPECT_EQ(east_.fullName(), "Sales-West");
  EXPECT_EQ(server_.log[5],
            "update departments set path=replace(path,N'.1.3.7.',N'.1.3.7.'),"
            "fullName=replace(fullName,N'Sales-East',N'Sales-West') where path like N'.1.3.7.%' and deptId<>7");
}

TEST_F(DepartmentTest, ANewDepartmentIsInsertedFirstAndGetsItsPathFromItsId) {
  answerSuper("_root", ".1.", "Group");
  server_.answer("select scope_identity()", {{{""}}, {{9.0}}});
  Department added;
  added.connect("host");
  added.Id("N");
  added.Name("North");
  added.Super("_root");
  ASSERT_TRUE(added.Save());
  EXPECT_EQ(added.InnerId(), 9);
  EXPECT_EQ(added.fullName(), "North") << "the root's name stands in no chain";
  EXPECT_EQ(added.fullId(), "");
  EXPECT_EQ(server_.log[3],
            "insert into departments(deptNo,deptName,superDept,fullName,isOrg,isOuter) "
            " values(N'N',N'North',5,N'North',0,0)");
  EXPECT_EQ(server_.log[5], "update departments set path=N'.1.9.' where deptId=9");
}

template <class Object>
Object refusedNew(Long errNumber, const Log& lastOfLog, FakeServer& server) {
  Object object;
  object.connect("host");
  if constexpr (std::is_same_v<Object, Department>) object.Id("N");
  object.Name("N");
  EXPECT_FALSE(object.Save());
  EXPECT_EQ(object.errNumber(), errNumber);
  EXPECT_EQ(Log(server.log.end() - static_cast<int>(lastOfLog.size()), server.log.end()), lastOfLog);
  return object;
}

TEST_F(DepartmentTest, ARowWhoseIdCantBeReadOrThatIsNotCommittedHasNone) {
  const String identity = "select scope_identity()";
  server_.answer("select count(*) from roles where roleName=N'N'", {{{""}}, {{Long{0}}}});
  server_.answer("select count(*) from ItemGroups where gName=N'N'", {{{""}}, {{Long{0}}}});
  server_.answer(identity, {{{""}}, {}});
  EXPECT_EQ(refusedNew<Department>(messageNumber(1103), {identity, "close"}, server_).InnerId(), 0);
  EXPECT_EQ(refusedNew<Role>(messageNumber(1203), {identity, "rollback", "close"}, server_).Id(), 0);
  EXPECT_EQ(refusedNew<userGroup>(messageNumber(1802), {identity, "rollback", "close"}, server_).Id(), 0);

  server_.answer(identity, {{{""}}, {{9.0}}});
  server_.fail("commit", Failure(number::timeout, "server", "late."));
  EXPECT_EQ(refusedNew<Role>(number::timeout, {"commit", "rollback", "close"}, server_).Id(), 0);
  EXPECT_EQ(refusedNew<userGroup>(number::timeout, {"commit", "rollback", "close"}, server_).Id(), 0);
}

TEST_F(DepartmentTest, ADepartmentWithChildrenOrUsersStaysAndAnEmptyOneTakesItsJobsAlong) {
  const String children = "select count(*) from departments where superDept=7";
  const String users = "select count(*) from users where deptId=7";
  server_.answer("select deptId from departments where deptNo=N'E'", {{{"deptId"}}, {{Long{7}}}});
  server_.answer(children, {{{""}}, {{Long{1}}}});
  server_.answer(users, {{{""}}, {{Long{1}}}});
  server_.answer("select jobId from jobs where deptId=7", {{{"jobId"}}, {{Long{11}}, {Long{12}}}});
  EXPECT_FALSE(east_.Delete("E"));
  EXPECT_EQ(east_.errNumber(), messageNumber(1004));
  server_.answer(children, {{{""}}, {{Long{0}}}});
  EXPECT_FALSE(east_.Delete("E"));
  EXPECT_EQ(east_.errNumber(), messageNumber(1006));

  server_.answer(users, {{{""}}, {{Long{0}}}});
  server_.log.clear();
  EXPECT_TRUE(east_.Delete("E"));
  EXPECT_EQ(Log(server_.log.begin() + 5, server_.log.end()),
            (Log{"select jobId from jobs where deptId=7", "delete from fldAcl where jobId in (11,12)",
                 "delete from cftJob where jobId in (11,12)", "delete from userJob where jobId in (11,12)",
                 "delete from repAcl where jobId in (11,12)", "delete from userMgr where jobId in (11,12)",
                 "delete from jobs where jobId in (11,12)", "delete from departments where deptId=7", "close"}));

  server_.fail("delete from repAcl where jobId in (11,12)", Failure(number::timeout, "server", "late."));
  server_.log.clear();
  EXPECT_FALSE(east_.Delete("E"));
  EXPECT_EQ(east_.errDescription(), "late.");
  EXPECT_EQ(server_.log[server_.log.size() - 2], "delete from repAcl where jobId in (11,12)");
}

}  // namespace
}  // namespace QVSa
