#include "tests/database/Shipped.h"
#include "tests/support/Failures.h"

namespace QVSa {
namespace {

using Keys = test::Shipped;
using test::failureOf;

// Each insert works once.
const char* const uniqueRows[] = {
    "insert into users(userName,userLogin) values('x','ann')",
    "insert into idRule(idName) values('invoice')",
    "insert into idRec(idName,ymd,maxId) values('invoice','20240301','1')",
    "insert into RptDirectory(class) values('A')",
    "insert into tasks(taskName,taskType) values('nightly',2)",
    "insert into AclRule(id) values(1)",
    "insert into QVTaskSche(taskId,schNo) values(1,1)",
    "insert into seslog(sesId) values('s1')",
    "insert into saferule(id) values(1)",
    "insert into userJob(userId,jobId) values(9,9)",
};

TEST_F(Keys, ASecondRowOfOneKeyIsRefused) {
  for (const String statement : uniqueRows) {
    run(statement);
    EXPECT_EQ(failureOf([&] { run(statement); }), number::integrity) << statement;
  }
  EXPECT_EQ(failureOf([&] { run("insert into users(userName,userLogin) values('x','ANN ')"); }), number::integrity);
  EXPECT_EQ(failureOf([&] { run("insert into homeinfo(id) values(1)"); }), number::integrity);
  EXPECT_EQ(failureOf([&] { run("insert into seslog(sesId) values(null)"); }), number::integrity);
}

TEST_F(Keys, NumbersAndNamesOfPeopleAndDepartmentsMayRepeat) {
  for (int i = 0; i < 2; ++i) {
    run("insert into departments(deptNo,deptName) values('D1','Sales')");
    run("insert into roles(roleName) values('Boss')");
    run("insert into ItemGroups(gName) values('Friends')");
    run("insert into users(userName,userLogin) values('Ann','ann" + std::to_string(i) + "')");
  }
  EXPECT_EQ(rows("select count(*) from departments where deptNo='D1'"), (test::Lines{"2"}));
}

TEST_F(Keys, ColumnsLeftOutTakeTheirDefaults) {
  if (test::onServer()) GTEST_SKIP() << test::serversClock;
  run("insert into users(userName,userLogin) values('Ann','ann')");
  run("insert into seslog(sesId) values('s1')");
  run("insert into idRule(idName) values('invoice')");
  run("insert into QVTaskSche(taskId,schNo) values(1,1)");
  run("insert into syslog(logId,logtype) values('1',0)");
  EXPECT_EQ(rows("select u.lgts,datediff(day,u.pwdDate,getdate()),datediff(day,s.begintime,s.lastActTime),r.predefined,"
                 "t.state,l.application from users u,seslog s,idRule r,QVTaskSche t,syslog l"
                 " where u.userLogin='ann' and r.idName='invoice'"),
            (test::Lines{"0|0|0|0|0|0"}));
}

TEST_F(Keys, AFlagOfThePolicyReadsMinusOneAsTrueAndAPlansFlagKeepsIt) {
  run("insert into saferule(id,lockErr) values(1,-1)");
  run("insert into QVBkPlan(taskId,delOld) values(1,-1)");
  EXPECT_EQ(rows("select count(*) from saferule where lockErr=1"), (test::Lines{"1"}));
  EXPECT_EQ(rows("select delOld from QVBkPlan"), (test::Lines{"-1"}));
}

}  // namespace
}  // namespace QVSa
