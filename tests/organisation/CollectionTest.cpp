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

}  // namespace
}  // namespace QVSa
