#include <gtest/gtest.h>

#include "tests/tsql/TreeText.h"

namespace QVSa::tsql {
namespace {

String value(const String& text) {
  return treeOf(std::get<SelectPtr>(parseText("select " + text)[0])->parts[0].core.items[0]);
}

String condition(const String& text) {
  return treeOf(std::get<SelectPtr>(parseText("select 1 where " + text)[0])->parts[0].core.where);
}

TEST(Expression, binds_arithmetic_by_strength_and_from_left_to_right) {
  EXPECT_EQ(value("a-b-c"), "(- (- a b) c)");
  EXPECT_EQ(value("a+b*c%d"), "(+ a (% (* b c) d))");
  EXPECT_EQ(value("a|b&c^d+e"), "(+ (^ (& (| a b) c) d) e)");
  EXPECT_EQ(value("a-(b-c)"), "(- a (- b c))");
}

TEST(Expression, binds_a_sign_weaker_than_a_product) {
  EXPECT_EQ(value("-a*b"), "(- (* a b))");
  EXPECT_EQ(value("-100/-100*10"), "(- (/ 100 (- (* 100 10))))");
  EXPECT_EQ(value("-a+b"), "(+ (- a) b)");
  EXPECT_EQ(value("a- -b"), "(- a (- b))");
  EXPECT_EQ(value("~a*b"), "(* (~ a) b)");
}

TEST(Expression, binds_conditions_not_before_and_before_or) {
  EXPECT_EQ(condition("a=1 or b=2 and not c=3 and d=4"), "(or (= a 1) (and (= b 2) (not (= c 3)) (= d 4)))");
  EXPECT_EQ(condition("(a=1 or b=2)and(c+1)*2>3"), "(and (or (= a 1) (= b 2)) (> (* (+ c 1) 2) 3))");
  EXPECT_EQ(condition("a between 1 and 2 and b not between c+1 and d"),
            "(and (between a 1 2) (not-between b (+ c 1) d))");
}

}  // namespace
}  // namespace QVSa::tsql
