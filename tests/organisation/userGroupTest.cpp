#include "tests/organisation/Company.h"

namespace QVSa {
namespace {

using test::Lines;

class userGroupTest : public test::Company {};

TEST_F(userGroupTest, AGroupIsSavedUnderANameOfItsOwn) {
  userGroup group = addGroup("Auditors");
  group.description("Look at 'everything'");
  EXPECT_TRUE(group.Save()) << "its own name is not taken";
  auto other = connected<userGroup>();
  EXPECT_EQ(refusal(other, other.Save()), messageNumber(1800));
  EXPECT_EQ(other.errDescription(), "Parameter is incompelte, name of user group is not assigned. ");
  other.Name("AUDITORS");
  EXPECT_EQ(refusal(other, other.Save()), messageNumber(1801));
  EXPECT_EQ(tables_.rows("select gName,gDesc from ItemGroups"), (Lines{"Auditors|Look at 'everything'"}));
  userGroup second = addGroup("Second");
  second.Name("auditors");
  EXPECT_EQ(refusal(second, second.Save()), messageNumber(1801));
  second.Name(String(101, 'x'));
  EXPECT_FALSE(second.Save());
  EXPECT_EQ(second.errDescription().substr(0, 35), "Error in updating the user group. S");

  ASSERT_TRUE(other.GetOne(2, "auditors"));
  EXPECT_EQ(other.Id(), group.Id());
  EXPECT_EQ(other.description(), "Look at 'everything'");
  ASSERT_TRUE(other.GetOne(1, second.Id()));
  EXPECT_EQ(other.Name(), "Second");
  EXPECT_FALSE(other.GetOne(3, "Second"));
  EXPECT_EQ(other.errDescription(), "User group [Second] is undefined.");
  EXPECT_EQ(other.errNumber(), messageNumber(1805));
}

TEST_F(userGroupTest, MembersAreReplacedAsAWhole) {
  const Long ann = addUser("ann", "E"), bob = addUser("bob", "H");
  userGroup group = addGroup("Auditors");
  EXPECT_EQ(group.GetUsers(), "");
  ASSERT_TRUE(group.SetUsers(text(ann) + "," + text(ann) + ",9999"));
  const String xml = "<users><user id=\"" + text(ann) + "\" name=\"ann\" deptFullName=\"East\"/></users>";
  EXPECT_EQ(group.GetUsers(), xml);
  EXPECT_EQ(connected<userGroup>().GetUsers(group.Id()), xml);
  EXPECT_EQ(refusal(group, group.SetUsers("one")), number::conversion);
  EXPECT_EQ(group.errDescription().substr(0, 38), "Error in setting members of user group");
  EXPECT_EQ(group.GetUsers(), xml) << "a failure changes nothing";
  ASSERT_TRUE(group.SetUsers(text(bob)));
  EXPECT_EQ(tables_.rows("select userId from GrpUser"), (Lines{text(bob)}));
  ASSERT_TRUE(group.SetUsers(""));
  EXPECT_EQ(group.GetUsers(), "");
}

TEST_F(userGroupTest, RolesAreReplacedByNameAndANameWithACommaIsLost) {
  userGroup group = addGroup("Auditors");
  String roles = "before";
  ASSERT_TRUE(group.GetRoles(roles));
  EXPECT_EQ(roles, "");
  addRole("A, B");
  ASSERT_TRUE(group.SetRoles("manager,Administrators,Nobody,A, B"));
  ASSERT_TRUE(group.GetRoles(roles));
  EXPECT_EQ(roles, "Administrators,Manager");
  ASSERT_TRUE(group.SetRoles(""));
  ASSERT_TRUE(group.GetRoles(roles));
  EXPECT_EQ(roles, "");
}

TEST_F(userGroupTest, ADeletedGroupTakesMembersAndRolesAlong) {
  const Long ann = addUser("ann", "E");
  userGroup group = addGroup("Auditors", text(ann), "Manager");
  addGroup("Others", text(ann), "Manager");
  ASSERT_TRUE(group.Delete());
  EXPECT_EQ(tables_.rows("select gName from ItemGroups g,GrpUser u,grpRole r where g.gId=u.gId and g.gId=r.gId"),
            (Lines{"Others"}));
  EXPECT_EQ(tables_.text("select count(*) from GrpUser"), "1");
  EXPECT_TRUE(group.Delete(4711));
}

TEST_F(userGroupTest, TheListReadsEachGroupAndANewOneInMemoryIsInserted) {
  userGroup auditors = addGroup("Auditors");
  auditors.description("Look");
  auditors.Save();
  addGroup("Others");
  auto groups = connected<userGroups>();
  ASSERT_TRUE(groups.GetAll());
  EXPECT_EQ(groups.Count(), 2);
  EXPECT_EQ(groups.Item("auditors")->description(), "Look");
  ASSERT_TRUE(groups.Item("others")->Delete());
  EXPECT_EQ(groups.Add("New")->Id(), 0);
  ASSERT_TRUE(groups.Item("New")->Save());
  ASSERT_TRUE(groups.GetAll());
  EXPECT_EQ(groups.Count(), 2);
  EXPECT_NE(groups.Item("New")->Id(), 0);
}

}  // namespace
}  // namespace QVSa
