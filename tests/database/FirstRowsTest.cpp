#include <regex>

#include "database/Scripts.h"
#include "tests/database/Shipped.h"

namespace QVSa {
namespace {

using FirstRows = test::Shipped;
using test::Lines;

TEST_F(FirstRows, TheTwoReservedDepartmentsAreTopsOfTheirOwn) {
  EXPECT_EQ(rows("select deptNo,deptId,superDept,path,isOrg,isOuter from departments order by deptId"),
            (Lines{"_root|1|0|.1.|1|0", "_out|2|0|.2.|0|1"}));
  EXPECT_EQ(rows("select h.companyName from homeinfo h,departments d where h.id=1 and d.deptNo='_root'"
                 " and d.deptName=h.companyName and d.fullName=h.companyName"),
            (Lines{"Company"}));
}

TEST_F(FirstRows, TheFixedJobsStandForTheirRolesInTheRoot) {
  EXPECT_EQ(rows("select j.jobId,r.roleId,r.roleName,r.builtIn from jobs j,roles r"
                 " where j.roleId=r.roleId and j.deptId=1 order by j.jobId"),
            (Lines{"1|1|Administrators|1", "2|2|Report Designers|1", "3|4|Report Owners|1", "4|3|Dept Admin|1"}));
  EXPECT_EQ(rows("select roleId,roleName from roles where roleId>4 order by roleId"),
            (Lines{"5|Process Admin", "6|Notice Admin"}));
}

TEST_F(FirstRows, TheAdministratorIsLockedUntilSomebodySetsAPassword) {
  EXPECT_EQ(rows("select u.userId,u.isAbstract,u.isRole,u.deptId,u.accstate,u.lgts,uj.jobId from users u,userJob uj"
                 " where u.userLogin='Admin' and u.userId=uj.userId"),
            (Lines{"1|1|0|1|1|0|1"}));
}

TEST_F(FirstRows, NewRowsGoOnBehindTheFixedIds) {
  run("insert into roles(roleName) values('Boss')");
  run("insert into jobs(roleId,deptId) values(7,1)");
  run("insert into users(userName,userLogin) values('Ann','ann')");
  EXPECT_EQ(rows("select r.roleId,j.jobId,u.userId from roles r,jobs j,users u"
                 " where r.roleName='Boss' and j.roleId=r.roleId and u.userLogin='ann'"),
            (Lines{"7|5|2"}));
}

TEST_F(FirstRows, BothDatabasesHaveDatedRulesOfTheSystem) {
  for (const char* database : {"QVSys", "QVApp"})
    EXPECT_EQ(rows("select idName,ymdStyle,noStyle,predefined from idRule order by noStyle,idName", database),
              (Lines{"_RC|3|6|1", "_ses|3|6|1", "_log|3|8|1"}));
}

TEST_F(FirstRows, EverySystemTableAndViewAnswersUnderTheApplicationDatabase) {
  const String script(database::qvSys);
  const std::regex definition(R"(\ncreate (table|view) (\w+))");
  int names = 0;
  for (std::sregex_iterator found(script.begin(), script.end(), definition), end; found != end; ++found, ++names) {
    const String name = (*found)[2];
    EXPECT_NO_THROW(rows("select count(*) from " + name, "QVApp")) << name;
  }
  EXPECT_GT(names, 30);
  EXPECT_EQ(rows("select userLogin from users where userId=1", "QVApp"), (Lines{"Admin"}));
}

TEST_F(FirstRows, NumbersAndTheLogOfTheApplicationAreItsOwn) {
  run("insert into idRule(idName,noStyle) values('invoice',4)", "QVApp");
  run("insert into syslog(logId,logtype) values('1',0)", "QVApp");
  run("insert into idDel(idName,theId,rcId,sesId) values('invoice','0001','r','s')", "QVApp");
  EXPECT_EQ(rows("select count(*) from idRule where idName='invoice'"), (Lines{"0"}));
  EXPECT_EQ(rows("select count(*) from syslog"), (Lines{"0"}));
  EXPECT_EQ(rows("select theId,state from QVIdDel", "QVApp"), (Lines{"0001|1"}));
  run("update QVIdDel set rcId=null,sesId=null,state=0 where sesId='s'", "QVApp");
  EXPECT_EQ(rows("select rcId,sesId,state from idDel", "QVApp"), (Lines{"-|-|0"}));
}

TEST_F(FirstRows, TheReleasesAreThoseThatThisLibraryReads) {
  EXPECT_EQ(rows("select s.release,u.version from QVSys..sysinfo s,updateInfo u", "QVUpdate"), (Lines{"8.1|8.1"}));
}

}  // namespace
}  // namespace QVSa
