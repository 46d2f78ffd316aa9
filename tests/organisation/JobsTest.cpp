#include "tests/organisation/Company.h"

namespace QVSa {

using test::Lines;
using test::names;

class JobsTest : public test::Company {
 protected:
  JobsTest() {
    manager_.setJobs(idOf("S") + "," + idOf("E") + "," + idOf("H"));
    clerk_ = addRole("Clerk");
    clerk_.setJobs(idOf("H"));
  }

  Boolean remove(Long roleId, Long deptId) {
    Connection connection;
    connection.Open(buildConnString(installation_.server(), "QVApp", false));
    Boolean ok = false;
    connected<Jobs>().removeJobs(connection, roleId, deptId, ok);
    return ok;
  }

  Role clerk_;
  Jobs jobs_ = connected<Jobs>();
};

TEST_F(JobsTest, TheyAreListedByDepartmentRoleAndHolder) {
  ASSERT_TRUE(jobs_.GetAll());
  EXPECT_EQ(jobs_.Count(), 8);
  EXPECT_EQ(jobs_.Item("1")->Name(), "Company--Administrators");
  EXPECT_TRUE(jobs_.Item("1")->builtIn());

  ASSERT_TRUE(jobs_.GetAll("h"));
  EXPECT_EQ(names(jobs_), (Lines{"Sales-East-Hub--Manager", "Sales-East-Hub--Clerk"}));
  ASSERT_TRUE(jobs_.GetAll("", "Manager"));
  EXPECT_EQ(names(jobs_), (Lines{"Sales--Manager", "Sales-East--Manager", "Sales-East-Hub--Manager"}));
  const auto east = jobs_.Item(text(manager_.GetJobIdOfTheDept(idOf("E"))));
  EXPECT_EQ(east->deptId(), "E");
  EXPECT_EQ(text(east->innerDeptId()), idOf("E"));
  EXPECT_EQ(east->deptName(), "East");
  EXPECT_EQ(east->roleId(), manager_.Id());
  EXPECT_FALSE(east->builtIn());

  const Long ann = addUser("ann", "E", text(east->Id()));
  ASSERT_TRUE(jobs_.GetAll("", "", ann));
  EXPECT_EQ(names(jobs_), (Lines{"Sales-East--Manager"}));
  ASSERT_TRUE(jobs_.GetAll("H", "", ann));
  EXPECT_EQ(jobs_.Count(), 0);

  addDepartment("<roleName>", "Odd", "W");
  job(clerk_, "<roleName>");
  ASSERT_TRUE(jobs_.GetAll("<roleName>"));
  EXPECT_EQ(names(jobs_), (Lines{"Works-Odd--Clerk"})) << "a number that reads as a token";
}

TEST_F(JobsTest, ADepartmentListsTheJobsBelowItToo) {
  ASSERT_TRUE(jobs_.GetAllOfDept(department("E").InnerId()));
  EXPECT_EQ(jobs_.Count(), 3);
  ASSERT_TRUE(jobs_.GetAllOfDept(department("E").InnerId(), "Manager"));
  EXPECT_EQ(names(jobs_), (Lines{"Sales-East--Manager", "Sales-East-Hub--Manager"}));
  ASSERT_TRUE(jobs_.GetAllOfDept(0, "Clerk"));
  EXPECT_EQ(jobs_.Count(), 1);
}

TEST_F(JobsTest, TheJobsOfAHoldersRolesNameTheirDepartmentByItsInnerId) {
  const Long ann = addUser("ann", "E", text(clerk_.GetJobIdOfTheDept(idOf("H"))));
  ASSERT_TRUE(jobs_.GetAllSameRole(ann));
  ASSERT_EQ(names(jobs_), (Lines{"Sales-East-Hub--Clerk"}));
  EXPECT_EQ(jobs_.Item(Long{1})->deptId(), idOf("H"));
  EXPECT_EQ(jobs_.Item(Long{1})->innerDeptId(), 0);
  ASSERT_TRUE(jobs_.GetAllSameRole());
  EXPECT_EQ(jobs_.Count(), 8);
}

TEST_F(JobsTest, OnlyTheJobOfTheRoleInTheDepartmentGoesWhereBothAreNamed) {
  EXPECT_TRUE(remove(0, 0) && connected<Role>().Delete());
  ASSERT_TRUE(jobs_.GetAll());
  EXPECT_EQ(jobs_.Count(), 8) << "nothing was named";
  EXPECT_TRUE(remove(manager_.Id(), department("H").InnerId()));
  ASSERT_TRUE(jobs_.GetAllOfDept(department("S").InnerId()));
  EXPECT_EQ(names(jobs_), (Lines{"Sales--Manager", "Sales-East--Manager", "Sales-East-Hub--Clerk"}));
}

}  // namespace QVSa
