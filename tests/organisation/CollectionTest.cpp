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

class ListsTest : public test::Company {
 protected:
  // What a list call tells before the database's own text.
  template <class List, class Call>
  String told(Call call) const {
    auto list = connected<List>();
    EXPECT_FALSE(call(list));
    EXPECT_EQ(list.errNumber(), number::noTable);
    return list.errDescription().substr(0, list.errDescription().find("Invalid object name"));
  }
};

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
  for (const char* table : {"departments", "roles", "ItemGroups"}) tables_.run(String("drop synonym ") + table);
  EXPECT_EQ(told<Departments>([](auto& list) { return list.GetAll(); }), "");
  EXPECT_EQ(told<Departments>([](auto& list) { return list.GetRoot(); }), "");
  EXPECT_EQ(told<Roles>([](auto& list) { return list.GetAll(); }), "Error in getting all roles. ");
  EXPECT_EQ(told<userGroups>([](auto& list) { return list.GetAll(); }), "Fail to get all user groups. ");
  EXPECT_EQ(told<Jobs>([](auto& list) { return list.GetAll(); }), "Fail to add new backup plan. ");
  EXPECT_EQ(told<Jobs>([](auto& list) { return list.GetAllOfDept(); }), "Fail to add new backup plan. ");
  EXPECT_EQ(told<Jobs>([](auto& list) { return list.GetAllSameRole(); }), "Fail to add new backup plan. ");
  EXPECT_EQ(told<Users>([](auto& list) { return list.GetAll(); }), "Error in listing users ");
  EXPECT_EQ(told<Users>([](auto& list) { return list.GetAllReg(); }), "");
  EXPECT_EQ(told<Users>([](auto& list) { return list.GetAllOfTheDept(0); }), "Error in listing users ");
  EXPECT_EQ(told<Users>([](auto& list) { return list.GetAllOfTheDeptAndRole(); }), "Error in listing users ");
  EXPECT_EQ(told<Users>([](auto& list) { return list.GetList(0) != -1; }), "Error in listing users ");
}

}  // namespace
}  // namespace QVSa
