#include "tests/support/Scene.h"

namespace QVSa {
namespace {

class UserRecord : public test::Scene {
 protected:
  UserRecord() {
    tables_.run("insert into ItemGroups(gName) values('one') insert into ItemGroups(gName) values('two')");
  }

  String jobs(Long id) const { return join(tables_.rows("select jobId from userJob where userId=" + text(id)), ","); }
  String groups(Long id) const { return join(tables_.rows("select gId from GrpUser where userId=" + text(id)), ","); }
};

TEST_F(UserRecord, WhatASaveWroteALoadFinds) {
  const struct {
    String (User::*get)() const;
    void (User::*set)(String);
  } texts[] = {{&User::Name, &User::Name},
               {&User::MobilePhone, &User::MobilePhone},
               {&User::Email, &User::Email},
               {&User::company, &User::company},
               {&User::Address, &User::Address},
               {&User::zipcode, &User::zipcode},
               {&User::telePhone, &User::telePhone},
               {&User::ipList, &User::ipList},
               {&User::OTPTokenId, &User::OTPTokenId},
               {&User::dn, &User::dn}};
  const struct {
    Boolean (User::*get)() const;
    void (User::*set)(Boolean);
  } flags[] = {{&User::sendSms, &User::sendSms},       {&User::keyLogin, &User::keyLogin},
               {&User::isOuter, &User::isOuter},       {&User::synLogin, &User::synLogin},
               {&User::useOTPAuth, &User::useOTPAuth}, {&User::PwdNoChange, &User::PwdNoChange}};
  User ann = connected<User>();
  ann.Login("ann");
  for (const String& mark : {String("d'A"), String("second ")}) {
    const bool isFirst = mark == "d'A";
    for (std::size_t i = 0; i < std::size(texts); ++i) (ann.*texts[i].set)(mark + text(static_cast<Long>(i)));
    for (const auto& flag : flags) (ann.*flag.set)(isFirst);
    ann.setJobs("2,3,99");
    ann.grpName("two");
    ASSERT_TRUE(ann.Save(true)) << ann.errDescription();
    ann = loaded("ann");
    for (std::size_t i = 0; i < std::size(texts); ++i)
      EXPECT_EQ((ann.*texts[i].get)(), mark + text(static_cast<Long>(i)));
    for (const auto& flag : flags) EXPECT_EQ((ann.*flag.get)(), isFirst) << &flag - flags;
  }
  ASSERT_TRUE(ann.GetOne(2, "SECOND 0"));
  EXPECT_EQ(ann.deptId(), "_root") << "nobody is without a department";
  EXPECT_TRUE(ann.isDesigner() && ann.isOwner());
  EXPECT_FALSE(ann.isAdministrator() || ann.isDeptadmin());
  EXPECT_EQ(ann.grpName(), "two");
  EXPECT_TRUE(connected<User>().GetOne(1, ann.Id()));
  User fresh;
  fresh.Id(3);
  fresh.Id(4);
  EXPECT_EQ(fresh.Id(), 3) << "set once";
  EXPECT_FALSE(ann.GetOne(9, "ann"));
  EXPECT_EQ(ann.errDescription(), "User does not exist.");
}

TEST_F(UserRecord, TheOrganisationIsTheDepartmentItselfOrTheNearestAbove) {
  for (const auto& [id, super, isOrg] : {std::tuple("A", "_root", true), {"B", "A", false}, {"C", "B", true}}) {
    auto department = connected<Department>();
    department.Id(id);
    department.Name(String("Department ") + id);
    department.Super(super);
    department.isOrg(isOrg);
    ASSERT_TRUE(department.Save());
  }
  for (const auto& [place, organisation] : {std::pair("A", "A"), {"B", "A"}, {"C", "C"}, {"_out", "_root"}}) {
    addUser(String("in") + place, [id = place](User& user) { user.deptId(id); });
    EXPECT_EQ(loaded(String("in") + place).orgId(), organisation);
  }
  EXPECT_EQ(loaded("inB").orgFullName(), "Department A");
  EXPECT_EQ(loaded("inB").deptFullName(), "Department A-Department B");
}

TEST_F(UserRecord, ASaveReplacesJobsAndGroupsByThoseItWasGiven) {
  addUser("ann", [](User& user) { user.setJobs("1,2"); });
  tables_.run("insert into GrpUser(gId,userId) values(1,2) insert into GrpUser(gId,userId) values(2,2)");
  User ann = loaded("ann");
  EXPECT_EQ(ann.grpName(), "one,two");
  ann.setJobs("2,4");
  EXPECT_TRUE(ann.Save());
  EXPECT_EQ(jobs(2), "2,4");
  EXPECT_EQ(groups(2), "") << "the two names were taken as one";

  ann = loaded("ann");
  ann.grpName("one");
  EXPECT_TRUE(ann.Save());
  EXPECT_EQ(jobs(2), "") << "the list of jobs is not loaded";
  EXPECT_EQ(groups(2), "1");

  User administrator = loaded("admin");
  administrator.setJobs("2");
  EXPECT_TRUE(administrator.Save());
  EXPECT_EQ(jobs(1), "1") << "a built-in user keeps his jobs";
}

TEST_F(UserRecord, ARefusedSaveWritesNothing) {
  addUser("ann", [](User& user) { user.setJobs("1"); });
  auto second = connected<User>();
  EXPECT_FALSE(second.Save());
  EXPECT_EQ(second.errDescription(), "Incomplete input, please reenter user name and account name.");
  second.Name("Second");
  second.Login("second");
  second.deptId("nowhere");
  EXPECT_EQ(refusal(second, second.Save()), number::noRow) << "no department to put him in";
  second.deptId("");
  second.Login("ANN ");
  EXPECT_EQ(refusal(second, second.Save()), number::integrity) << "log-ins are unique without regard to case";
  // The jobs of a new user are found by his name, and Ann's own are among them.
  second.Name("Ann");
  second.Login("ann2");
  second.setJobs("1");
  EXPECT_EQ(refusal(second, second.Save()), number::integrity);
  EXPECT_EQ(second.Id(), 0);
  EXPECT_EQ(tables_.text("select count(*) from users"), "2");

  User ann = loaded("ann");
  ann.Name("Other");
  ann.setJobs("1,");
  EXPECT_EQ(refusal(ann, ann.Save()), number::statement);
  EXPECT_EQ(loaded("ann").Name(), "Ann");
  EXPECT_EQ(jobs(2), "1");
}

TEST(APassword, ClearsTheTextThatIsHandedOverToIt) {
  String given = "secret";
  EXPECT_EQ(Password(given).text(), "secret");
  EXPECT_EQ(given, "secret");
  const char* const memory = given.data();
  EXPECT_EQ(Password(std::move(given)).text(), "secret");
  // NOLINTNEXTLINE(clang-analyzer-cplusplus.InnerPointer): a short text lies in the object, which is still there
  EXPECT_EQ(String(memory, 6), String(6, '\0'));
}

TEST_F(UserRecord, ADeleteTakesTheGroupsAndLeavesTheJobs) {
  addUser("ann", [](User& user) {
    user.setJobs("1");
    user.grpName("one");
  });
  tables_.run("insert into agentuser(agentuserid) values(2)");
  EXPECT_TRUE(connected<User>().Delete());
  EXPECT_EQ(tables_.text("select count(*) from users"), "2") << "nobody has the id 0";
  EXPECT_TRUE(loaded("ann").Delete());
  EXPECT_EQ(tables_.text("select count(*) from users"), "1");
  EXPECT_EQ(tables_.text("select count(*) from agentuser"), "0");
  EXPECT_EQ(groups(2), "");
  EXPECT_EQ(jobs(2), "1");
}

}  // namespace
}  // namespace QVSa
