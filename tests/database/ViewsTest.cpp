#include "tests/database/Shipped.h"

namespace QVSa {
namespace {

using test::Lines;

// _root (1) over Sales (10, an organisation) over East (11) over Hub (12), and over Plain (13); a ring of 20 and 21
// with 22 to 24 below it, and 25 above itself; 30, whose superior is not there.
class Views : public test::Shipped {
 protected:
  void SetUp() override {
    run("set identity_insert departments on");
    department(10, "Sales", 1, ".1.10.", 1);
    department(11, "East", 10, ".1.10.11.", 0);
    department(12, "Hub", 11, ".1.10.11.12.", 0);
    department(13, "Plain", 1, ".1.13.", 0);
    department(20, "Ring", 21, ".21.20.", 0);
    department(21, "Rong", 20, ".20.21.", 0);
    for (int tail : {22, 23, 24}) department(tail, "Tail", tail - 1, "", 0);
    department(25, "Self", 25, ".25.", 0);
    department(30, "Orphan", 999, ".999.30.", 0);
  }

  void department(int id, const String& name, int superior, const String& path, int isOrg) {
    run("set identity_insert departments on insert into "
        "departments(deptId,deptNo,deptName,superDept,fullName,path,isOrg,"
        "isOuter) values(" +
        std::to_string(id) + ",'N" + std::to_string(id) + "','" + name + "'," + std::to_string(superior) + ",'full " +
        name + "','" + path + "'," + std::to_string(isOrg) + ",0)");
  }

  String job(int role, int dept) {
    run("insert into jobs(roleId,deptId) values(" + std::to_string(role) + "," + std::to_string(dept) + ")");
    return rows("select max(jobId) from jobs")[0];
  }
};

TEST_F(Views, TheTreeCountsLevelsFromItsTopsAndLeavesRingsOut) {
  EXPECT_EQ(rows("select deptNo,l,superNo,superDept from QV_v_Dept where isOuter=0 order by l,deptNo"),
            (Lines{"_root|1|-|0", "N30|1|-|999", "N10|2|_root|1", "N13|2|_root|1", "N11|3|N10|10", "N12|4|N11|11"}));
  EXPECT_EQ(rows("select deptName,fullName,path,isOrg from QV_v_Dept where deptId=12"),
            (Lines{"Hub|full Hub|.1.10.11.12.|0"}));
}

TEST_F(Views, AnOrganisationIsTheNearestAtOrAboveElseTheRoot) {
  const Lines expected{"1|1|_root", "2|1|_root", "10|10|N10", "11|10|N10", "12|10|N10", "13|1|_root", "30|1|_root"};
  for (const char* view : {"QV_v_DeptOrg_1", "QV_v_DeptOrg_1WithLevel"})
    EXPECT_EQ(rows("select deptId,orgId,orgno from " + String(view) + " order by deptId"), expected) << view;
  EXPECT_EQ(rows("select deptName,deptfullName from QV_v_DeptOrg_1 where deptId=11"), (Lines{"East|full East"}));
}

TEST_F(Views, TheWayUpFromAJobMarksItsOwnDepartmentAndEndsAtTheTop) {
  const String hub = job(2, 12);
  for (int inRing : {20, 22, 24, 25}) job(2, inRing);
  EXPECT_EQ(
      rows("select deptid,x,pathDeptId,pathDeptName,superDeptId,deptNo,l from QV_v_JobDeptPathWithLevel"
           " where jobid=" +
           hub + " order by l"),
      (Lines{"12|1|1|Company|0|_root|1", "12|1|10|Sales|1|N10|2", "12|1|11|East|10|N11|3", "12|0|12|Hub|11|N12|4"}));
  EXPECT_EQ(rows("select fullName,path from QV_v_JobDeptPath where jobid=" + hub + " and x=0"),
            (Lines{"full Hub|.1.10.11.12."}));
  EXPECT_EQ(rows("select count(*) from QV_v_JobDeptPath where deptid>=20"), (Lines{"0"}));
}

TEST_F(Views, ARoleHeldTwiceOrThroughAGroupStandsOnce) {
  run("insert into userJob(userId,jobId) values(7," + job(2, 10) + ")");
  run("insert into userJob(userId,jobId) values(7," + job(2, 11) + ")");
  run("insert into GrpUser(gId,userId) values(1,7)");
  run("insert into grpRole(gId,roleId) values(1,2)");
  run("insert into grpRole(gId,roleId) values(1,5)");
  EXPECT_EQ(rows("select roleName from v_userRole where userId=7 order by roleName"),
            (Lines{"Process Admin", "Report Designers"}));
}

}  // namespace
}  // namespace QVSa
