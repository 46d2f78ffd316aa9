#include "QVSa/classification/AclRule.h"
#include "tests/support/Scene.h"

namespace QVSa {
namespace {

class AccessRule : public test::Scene {
 protected:
  AccessRule() { rule_.connect(server(), "QVApp"); }

  AclRule rule_;
};

TEST_F(AccessRule, IsInsertedOnceAndThenUpdatedWhateverItsId) {
  rule_.RWType(5);
  EXPECT_TRUE(rule_.GetOne());
  EXPECT_EQ(rule_.Id(), 0);
  EXPECT_EQ(rule_.RWType(), 5) << "no row: what is set stays";

  rule_.RWDeptSet(-2);
  rule_.RWRoleSet(3);
  rule_.DesignType(4);
  rule_.DesignDeptSet(6);
  rule_.DesignRoleSet(7);
  rule_.ExcludeAdmin(-1);
  EXPECT_TRUE(rule_.Save()) << rule_.errDescription();
  EXPECT_EQ(rule_.Id(), 1);
  const String columns =
      "select id,RWType,RWDeptSet,RWRoleSet,DesignType,DesignDeptSet,DesignRoleSet,excludeAdmin from AclRule";
  EXPECT_EQ(tables_.text(columns), "1|5|-2|3|4|6|7|-1");

  AclRule other;
  other.connect(server());
  EXPECT_EQ(refusal(other, other.Save()), number::integrity) << "the rule is there, and was not loaded";
  EXPECT_EQ(other.Id(), 0);
  EXPECT_TRUE(other.GetOne());
  EXPECT_EQ(other.ExcludeAdmin(), -1);
  EXPECT_EQ(other.DesignRoleSet(), 7);
  other.Id(9);
  other.RWRoleSet(8);
  EXPECT_TRUE(other.Save());
  EXPECT_EQ(tables_.text(columns), "1|5|-2|8|4|6|7|-1");
}

}  // namespace
}  // namespace QVSa
