#include <gtest/gtest.h>

#include "QVSa/values/Failure.h"
#include "tests/tsql/TreeText.h"

namespace QVSa::tsql {
namespace {

// Native number and text of the failure, or nothing where the batch is taken.
String refusal(const String& batch) {
  try {
    parseText(batch);
  } catch (const Failure& failure) {
    return std::to_string(failure.native()) + " " + failure.description();
  }
  return {};
}

Long number(const String& batch) {
  const String text = refusal(batch);
  return text.empty() ? 0 : std::stoi(text);
}

TEST(Refusal, names_the_word_that_does_not_fit) {
  EXPECT_EQ(refusal("select id frm t1"), "102 Incorrect syntax near 't1'.");
  EXPECT_EQ(refusal("select Desc from t"), "156 Incorrect syntax near the keyword 'Desc'.");
  EXPECT_EQ(refusal("select id from t where"), "102 Incorrect syntax near 'where'.");
  EXPECT_EQ(refusal("select id from t where u.deptid = <deptID>"), "102 Incorrect syntax near '<'.");
  EXPECT_EQ(refusal("select id from t where ( or name='a')"), "156 Incorrect syntax near the keyword 'or'.");
  EXPECT_EQ(refusal("selec * from t"), "102 Incorrect syntax near '*'.");
  EXPECT_EQ(refusal("select 1 sp_who"), "");
  EXPECT_EQ(refusal("set nocount on sp_who"), "102 Incorrect syntax near 'sp_who'.");
}

TEST(Refusal, keeps_values_and_conditions_apart) {
  EXPECT_EQ(number("select (a=b) from t"), 102);
  EXPECT_EQ(number("select 1 where a=b=c"), 102);
  EXPECT_EQ(number("select isnull(a like b,1)"), 156);
  EXPECT_EQ(number("select 1+(a is null)"), 156);
  EXPECT_EQ(refusal("select 1 where a and b=1"),
            "4145 An expression of non-boolean type specified in a context where a condition is expected, near 'and'.");
  EXPECT_EQ(number("select 1 where not a"), 4145);
  EXPECT_EQ(number("select case when a then 1 end"), 4145);
  EXPECT_EQ(number("select case a when b=1 then 1 end"), 102);
}

TEST(Refusal, counts_the_arguments_of_known_functions) {
  EXPECT_EQ(refusal("select isnull(roleSpec) from roles"), "174 The isnull function requires 2 argument(s).");
  EXPECT_EQ(refusal("select LEN('a','b')"), "174 The len function requires 1 argument(s).");
  EXPECT_EQ(refusal("select charindex('a')"), "189 The charindex function requires 2 to 3 arguments.");
  EXPECT_EQ(number("select count()"), 174);
  EXPECT_EQ(number("select coalesce(1)"), 174);
  EXPECT_EQ(number("select coalesce(1,2,3,4)"), 0);
  EXPECT_EQ(refusal("select Soundx('a')"), "195 'Soundx' is not a recognized built-in function name.");
  EXPECT_EQ(refusal("select dateadd(fortnight,1,x)"), "155 'fortnight' is not a recognized dateadd option.");
  EXPECT_EQ(number("select dateadd(1,1,x)"), 1023);
  EXPECT_EQ(number("select sum(*) from t"), 102);
}

TEST(Refusal, refuses_what_a_select_cannot_hold) {
  EXPECT_EQ(refusal("select top -1 a from t"), "1014 A TOP or FETCH clause contains an invalid value.");
  EXPECT_EQ(number("select top (-5) a from t"), 1014);
  EXPECT_EQ(number("select top x a from t"), 102);
  EXPECT_EQ(number("select a from (select 1 as a)"), 102);
  EXPECT_EQ(number("select a from t with (fastest)"), 321);
  EXPECT_EQ(number("select a from t where a in ()"), 102);
  EXPECT_EQ(number("select a from t where exists (1)"), 102);
  EXPECT_EQ(number("select a from t cross join u on 1=1"), 156);
  EXPECT_EQ(number("select a from t join u"), 102);
  EXPECT_EQ(number("select case a end"), 156);
  EXPECT_EQ(refusal("select @a"), "137 Must declare the scalar variable \"@a\".");
  EXPECT_EQ(number("select a.b.c.d.e from t"), 117);
  EXPECT_EQ(number("select cast(a as varchar(-1))"), 102);
}

TEST(Refusal, matches_columns_and_values_of_an_insert) {
  EXPECT_EQ(number("insert into t(a,b) values (1)"), 109);
  EXPECT_EQ(number("insert into t(a) values (1,2)"), 110);
  EXPECT_EQ(number("insert into t(a,b) values (1,2),(3)"), 109);
  EXPECT_EQ(number("insert into t values (1,2),(3)"), 10709);
  EXPECT_EQ(number("insert into t(a) values ()"), 102);
  EXPECT_EQ(number("update t set a*=2"), 102);
  EXPECT_EQ(number("set ansi_nulls on"), 195);
  EXPECT_EQ(number("grant select on t to u"), 156);
  EXPECT_EQ(number("begin select 1 end"), 156);
}

}  // namespace
}  // namespace QVSa::tsql
