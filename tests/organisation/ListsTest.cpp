#include "QVSa/frame/Collection.h"
#include "tests/organisation/Company.h"
#include "tests/support/Failures.h"

namespace QVSa {
namespace {

using test::failureOf;
using test::names;

TEST(CollectionTest, WhatIsNotThereIsNoObjectForItemAndAFailureForRemove) {
  userGroups groups;
  groups.Add("one");
  for (const Variant& index : {Variant(Long{0}), Variant(Long{2}), Variant("1"), Variant::null()})
    EXPECT_EQ(groups.Item(index), nullptr);
  EXPECT_EQ(groups.errNumber(), 0);
  EXPECT_EQ(failureOf([&] { groups.Remove(Long{2}); }), number::position);
  EXPECT_EQ(failureOf([&] { groups.Remove("1"); }), number::argument);
  EXPECT_EQ(groups.errNumber(), 0);
  EXPECT_TRUE(groups.Remove("ONE").isEmpty());
  EXPECT_EQ(groups.Count(), 0);
  groups.Add("one");
}

TEST(CollectionTest, ACollectionThatOutgrewItsCounterCanNoLongerBeEmptied) {
  Users users;
  for (int i = 0; i < 32'767; ++i) users.Add(std::to_string(i), "");
  EXPECT_EQ(users.Count(), 32'767);
  users.Add("one more", "");
  EXPECT_EQ(failureOf([&] { users.Count(); }), number::overflow);
  EXPECT_EQ(failureOf([&] { users.Clear(); }), number::overflow);
  EXPECT_FALSE(users.GetAll());
  EXPECT_EQ(users.errNumber(), number::overflow);
  EXPECT_EQ(users.errDescription(), "Error in listing users Overflow");
  EXPECT_NE(users.Item("one more"), nullptr);
}

class ListsTest : public test::Company {};

TEST_F(ListsTest, AListThatMeetsAKeyTwiceFailsAndKeepsWhatItHad) {
  Role second = addRole("Second");
  second.Name("MANAGER");
  ASSERT_TRUE(second.Save()) << "only an insert looks whether the name is taken";
  auto roles = connected<Roles>();
  EXPECT_EQ(refusal(roles, roles.GetAll()), number::keyExists);
  EXPECT_EQ(roles.errDescription(),
            "Error in getting all roles. This key is already associated with an element of this collection");
  EXPECT_EQ(roles.Count(), 7);

  addUser("twin", "E");
  tables_.run(
      "insert into users(userName,userLogin,deptId) select userName,'other',deptId from users where userName='twin'");
  auto users = connected<Users>();
  EXPECT_FALSE(users.GetAllOfTheDept(0));
  EXPECT_EQ(names(users), (test::Lines{"Administrator", "twin"}));
}

// Texts that would break a statement, an XML text or a pattern which does not hold them apart from its own signs.
const String hardTexts[] = {"O'Brien''s",
                            "<roleDesc>x<gId>",
                            "[brackets] and ]]",
                            "100 % _under_",
                            "-- ; drop table roles",
                            "\xF0\x9F\x98\x80 smiles",
                            "\xE9\x94\x80\xE5\x94\xAE\xE9\x83\xA8",
                            "a|b\"c\\d\te",
                            "bell\x07 and \xEF\xBF\xBF"};

class HardTextsTest : public test::Company {
 protected:
  test::Lines tree() const { return tables_.rows("select deptNo,deptName,fullName,path from departments"); }
};

TEST_F(HardTextsTest, ARoleAGroupAndADepartmentAreFoundByThemAgain) {
  for (const String& name : hardTexts) {
    SCOPED_TRACE(name);
    auto role = connected<Role>();
    role.Name(name);
    ASSERT_TRUE(role.Save()) << role.errDescription();
    auto loaded = connected<Role>();
    ASSERT_TRUE(loaded.GetOne(2, name)) << loaded.errDescription();
    EXPECT_EQ(loaded.Name(), name);
    EXPECT_EQ(loaded.Id(), role.Id());

    userGroup group = addGroup(name, "1", name);
    String roles;
    ASSERT_TRUE(group.GetRoles(roles));
    EXPECT_EQ(roles, name);

    addDepartment("no " + name, name, "S");
    const Department below = department("no " + name);
    EXPECT_EQ(below.fullName(), "Sales-" + name);
    addUser(name, below.Id());
    auto user = connected<User>();
    EXPECT_TRUE(user.loginAuth(name, "secret", nullptr, false, "", name)) << user.errDescription();
    EXPECT_EQ(user.deptFullName(), "Sales-" + name);
    Jobs jobs = connected<Jobs>();
    ASSERT_TRUE(role.setJobs(text(below.InnerId())));
    ASSERT_TRUE(jobs.GetAll(below.Id(), name)) << jobs.errDescription();
    EXPECT_EQ(test::names(jobs), (test::Lines{"Sales-" + name + "--" + name}));
  }
  EXPECT_EQ(tables_.text("select count(*) from roles where builtIn=1"), "6");
  auto groups = connected<userGroups>();
  EXPECT_TRUE(groups.GetAll()) << groups.errDescription();
}

TEST_F(HardTextsTest, ATokenInACallersOwnSqlIsNone) {
  auto user = connected<User>();
  user.Name("1");
  user.Login("intruder");
  user.setJobs("<userName>");
  EXPECT_FALSE(user.Save()) << "job 1 is that of the administrators";
  auto log = connected<LogRecords>();
  std::vector<Variant> query{Date::empty(), Date::empty(), "", "<desc>", "", "%"};
  EXPECT_TRUE(log.Add(1, 1, "", ""));
  EXPECT_TRUE(log.GetLogByQuery(query, 1)) << log.errDescription();
  EXPECT_EQ(log.Count(), 0);
}

}  // namespace
}  // namespace QVSa
