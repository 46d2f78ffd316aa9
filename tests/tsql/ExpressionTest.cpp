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

TEST(Expression, reads_every_predicate) {
  EXPECT_EQ(condition("a is null or b is not null"), "(or (null? a) (not-null? b))");
  EXPECT_EQ(condition("a like '%'+b+'%' and c not like 'x!%' escape '!'"),
            "(and (like a (+ (+ '%' b) '%')) (not-like c 'x!%' '!'))");
  EXPECT_EQ(condition("a in (1,-2) and b not in (c,1) and d in (select e from t)"),
            "(and (in a [1 -2]) (not-in b c 1) (in d  { e from .t where - group having -} order))");
  EXPECT_EQ(condition("not exists (select * from t)"), "(not (exists  { * from .t where - group having -} order))");
  EXPECT_EQ(condition("a<>b and c!=d and e!<f"), "(and (<> a b) (<> c d) (>= e f))");
}

TEST(Expression, reads_names_of_up_to_four_parts) {
  EXPECT_EQ(value("QVSys..users.[user name]"), "QVSys..users.user name");
  EXPECT_EQ(value("db.dbo.t.c"), "db.dbo.t.c");
}

TEST(Expression, reads_functions_case_and_conversions) {
  EXPECT_EQ(value("LEFT(x,len(x)-1)"), "(left x (- (len x) 1))");
  EXPECT_EQ(value("count(distinct a)"), "(count distinct a)");
  EXPECT_EQ(value("Count(*)+1"), "(+ (count *) 1)");
  EXPECT_EQ(value("case when a=1 then 'x' else 'y' end"), "(case (= a 1)=>'x' else=>'y')");
  EXPECT_EQ(value("case a+1 when 1 then b when null then null end"), "(case (+ a 1) 1=>b null=>null)");
  EXPECT_EQ(value("case a when 1 then 2 else case when b=1 then 3 else case c when 4 then 5 else 6 end end end"),
            "(case a 1=>2 case - (= b 1)=>3 case c 4=>5 else=>6)");
  EXPECT_EQ(value("case a when 1 then 2 else case b when 3 then 4 end+5 end"),
            "(case a 1=>2 else=>(+ (case b 3=>4) 5))");
  EXPECT_EQ(value("convert(VARCHAR(30),getdate(),120)"), "(convert:varchar(30) (getdate) 120)");
  EXPECT_EQ(value("cast(a as nvarchar(max))"), "(cast:nvarchar(max) a)");
  EXPECT_EQ(value("(select max(a) from t)"), "(value  { (max a) from .t where - group having -} order)");
}

TEST(Expression, reads_date_parts_by_all_their_names) {
  EXPECT_EQ(value("dateadd(dd,1,x)"), "(dateadd day 1 x)");
  EXPECT_EQ(value("datediff(n,x,y)"), "(datediff minute x y)");
  EXPECT_EQ(value("datepart(YYYY,x)"), "(datepart year x)");
  EXPECT_EQ(value("datepart(dw,x)+datepart(dy,x)+datepart(ww,x)"),
            "(+ (+ (datepart weekday x) (datepart dayofyear x)) (datepart week x))");
}

}  // namespace
}  // namespace QVSa::tsql
