#include "QVSa/frame/Collection.h"
#include "tests/organisation/Company.h"
#include "tests/support/Failures.h"

namespace QVSa {
namespace {

using test::failureOf;
using test::names;

TEST(CollectionTest, ItemsAreFoundByPositionAndByKeyInAnyCase) {
  Roles roles;
  roles.Add(7, "Manager");
  roles.Add(8, "5");
  EXPECT_EQ(roles.Count(), 2);
  EXPECT_EQ(roles.Item(Long{1})->Id(), 7);
  EXPECT_EQ(roles.Item("MANAGER")->Id(), 7);
  EXPECT_EQ(roles.Item("5")->Id(), 8) << "a text is a key, digits too";
  EXPECT_EQ(failureOf([&] { roles.Add(9, "manager"); }), number::keyExists);
  EXPECT_EQ(roles.Count(), 2);
}

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

TEST_F(ListsTest, AListReplacesTheOneBeforeAndItsRecordsAreConnected) {
  auto roles = connected<Roles>();
  ASSERT_TRUE(roles.GetAll());
  roles.Add(0, "Not stored");
  ASSERT_TRUE(roles.GetAll());
  EXPECT_EQ(roles.Count(), 7);
  EXPECT_TRUE(roles.Item("Administrators")->builtIn());
  const auto manager = roles.Item("Manager");
  manager->description("Leads");
  ASSERT_TRUE(manager->Save());
  EXPECT_EQ(tables_.text("select roleDesc from roles where roleName='Manager'"), "Leads");
}

TEST_F(ListsTest, AListThatMeetsAKeyTwiceFailsAndKeepsWhatItHad) {
  Role second = addRole("Second");
  second.Name("MANAGER");
  ASSERT_TRUE(second.Save()) << "only an insert looks whether the name is taken";
  auto roles = connected<Roles>();
  EXPECT_FALSE(roles.GetAll());
  EXPECT_EQ(roles.errNumber(), number::keyExists);
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

TEST_F(ListsTest, EachListReportsAFailureByItsOwnMessage) {
  const auto told = [](auto& list, Boolean done) {
    EXPECT_FALSE(done);
    EXPECT_EQ(list.errNumber(), number::noTable);
    const String text = list.errDescription();
    return text.substr(0, text.find("Invalid object name"));
  };
  for (const char* table : {"departments", "roles", "ItemGroups"}) tables_.run(String("drop synonym ") + table);
  auto departments = connected<Departments>();
  EXPECT_EQ(told(departments, departments.GetAll()), "");
  EXPECT_EQ(told(departments, departments.GetRoot()), "");
  auto roles = connected<Roles>();
  EXPECT_EQ(told(roles, roles.GetAll()), "Error in getting all roles. ");
  auto groups = connected<userGroups>();
  EXPECT_EQ(told(groups, groups.GetAll()), "Fail to get all user groups. ");
  auto jobs = connected<Jobs>();
  EXPECT_EQ(told(jobs, jobs.GetAll()), "Fail to add new backup plan. ");
  EXPECT_EQ(told(jobs, jobs.GetAllOfDept()), "Fail to add new backup plan. ");
  EXPECT_EQ(told(jobs, jobs.GetAllSameRole()), "Fail to add new backup plan. ");
  auto users = connected<Users>();
  EXPECT_EQ(told(users, users.GetAll()), "Error in listing users ");
  EXPECT_EQ(told(users, users.GetAllReg()), "");
  EXPECT_EQ(told(users, users.GetAllOfTheDept(0)), "Error in listing users ");
  EXPECT_EQ(told(users, users.GetAllOfTheDeptAndRole()), "Error in listing users ");
  EXPECT_EQ(told(users, users.GetList(0) != -1), "Error in listing users ");
}

}  // namespace
}  // namespace QVSa
