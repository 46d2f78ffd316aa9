#include "QVSa/hosting/RuleKeeping.h"
#include "tests/support/Scene.h"

namespace QVSa::test {
namespace {

class RuleKept : public Scene {};

TEST_F(RuleKept, ADatePartDoesNotChangeInAPeriodWithNumbers) {
  auto rule = connected<IdMgr>();
  auto keeping = connected<RuleKeeping>();
  rule.idName("inv");
  rule.DateFormat(yymmdd);
  rule.numPlace(2);
  ASSERT_TRUE(keeping.save(rule)) << keeping.errDescription();
  EXPECT_EQ(rule.newId("inv"), "24030701");
  rule.numPlace(3);
  ASSERT_TRUE(keeping.save(rule)) << keeping.errDescription();
  ASSERT_TRUE(keeping.save(rule)) << keeping.errDescription();
  EXPECT_EQ(rule.newId("inv"), "240307002") << "widened once";

  // The day before is in the month that the new date part counts.
  clock_.set(Date(2024, 3, 8));
  rule.DateFormat(yymm);
  EXPECT_FALSE(keeping.save(rule));
  EXPECT_EQ(keeping.errNumber(), number::argument);
  EXPECT_EQ(tables_.text("select ymdStyle from idRule where idName='inv'"), std::to_string(yymmdd));
  ASSERT_TRUE(keeping.save(rule, true)) << keeping.errDescription();
  EXPECT_EQ(rule.newId("inv"), rule.newId("inv")) << "this is what it was refused for";

  clock_.set(Date(2024, 4, 1));
  rule.DateFormat(yyyymmdd);
  ASSERT_TRUE(keeping.save(rule)) << keeping.errDescription();
}

}  // namespace
}  // namespace QVSa::test
