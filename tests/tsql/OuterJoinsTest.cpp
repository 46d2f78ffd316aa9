#include <gtest/gtest.h>

#include "QVSa/values/Failure.h"
#include "providers/tsql/OuterJoins.h"
#include "tests/tsql/TreeText.h"

namespace QVSa::tsql {
namespace {

String rewritten(const String& batch) {
  Statement statement = std::move(parseText(batch).at(0));
  try {
    rewriteOuterJoins(statement);
  } catch (const Failure& failure) {
    return std::to_string(failure.native());
  }
  return print(statement);
}

TEST(OuterJoins, become_left_joins_from_either_side) {
  EXPECT_EQ(rewritten("select d1.* from d d1,d d2 where d1.up*=d2.id and d1.no='S'"),
            "select d1.* from d as d1 left join d as d2 on d1.up = d2.id where d1.no = N'S'");
  EXPECT_EQ(rewritten("select a.x from a,b where a.x=*b.y"), "select a.x from b left join a on a.x = b.y");
}

TEST(OuterJoins, take_conditions_on_the_inner_table_alone_into_the_join) {
  EXPECT_EQ(
      rewritten("select u.id from users u,userJob j1,userJob j2,regInfo r where u.isRole=0 and j1.jobId=1 and "
                "u.id*=j1.userId and j2.jobId=2 and u.id*=j2.userId and u.id*=r.userId and r.x is null"),
      "select u.id from users as u left join userJob as j1 on u.id = j1.userId and j1.jobId = 1 left join userJob "
      "as j2 on u.id = j2.userId and j2.jobId = 2 left join regInfo as r on u.id = r.userId and r.x is null where "
      "u.isRole = 0");
}

TEST(OuterJoins, leave_conditions_of_several_tables_and_unqualified_columns_in_the_where_clause) {
  EXPECT_EQ(rewritten("select 1 from a,b where a.x*=b.x and (b.y=1 or a.y=2) and z=3 and b.y=z"),
            "select 1 from a left join b on a.x = b.x where (b.y = 1 or a.y = 2) and z = 3 and b.y = z");
  EXPECT_EQ(rewritten("select 1 from log l,tmp rt where logType=1 and l.rtId*=rt.id and rtId*=rt.no"),
            "select 1 from log as l left join tmp as rt on l.rtId = rt.id and rtId = rt.no where logType = 1");
}

TEST(OuterJoins, put_all_other_tables_first_and_derived_tables_beside_them) {
  EXPECT_EQ(rewritten("select 1 from d1,d2,(select id from t) as f where d1.up *= d2.id and (d1.id=f.id or d1.n>0)"),
            "select 1 from d1 cross join (select id from t) as f left join d2 on d1.up = d2.id where d1.id = f.id or "
            "d1.n > 0");
  EXPECT_EQ(rewritten("select 1 from a,(select id from t) f where a.id*=f.id"),
            "select 1 from a left join (select id from t) as f on a.id = f.id");
}

TEST(OuterJoins, stand_behind_the_tables_that_they_hang_on) {
  EXPECT_EQ(rewritten("select 1 from c,b,a where b.x*=c.x and a.x*=b.x"),
            "select 1 from a left join b on a.x = b.x left join c on b.x = c.x");
  EXPECT_EQ(rewritten("select 1 from a,b,c where a.x*=c.x and b.x*=c.y"),
            "select 1 from a cross join b left join c on a.x = c.x and b.x = c.y");
}

TEST(OuterJoins, are_found_in_every_block) {
  EXPECT_EQ(
      rewritten("insert into t select 1 from a,b where a.x*=b.x union select 2 from c where exists (select 1 from "
                "a,b where a.y*=b.y)"),
      "insert into t select 1 from a left join b on a.x = b.x union select 2 from c where exists (select 1 from a "
      "left join b on a.y = b.y)");
  EXPECT_EQ(
      rewritten("select (select 1 from a,b where a.x*=b.x) from (select 2 as q from a,b where a.x*=b.x) f"),
      "select (select 1 from a left join b on a.x = b.x) from (select 2 as q from a left join b on a.x = b.x) as f");
  EXPECT_EQ(rewritten("update a set x=b.x from a,b where a.y*=b.y"),
            "update a set x = b.x from a left join b on a.y = b.y");
  EXPECT_EQ(rewritten("delete a from a,b where a.y*=b.y and b.q=1"),
            "delete from a from a left join b on a.y = b.y and b.q = 1");
}

TEST(OuterJoins, look_through_subqueries_for_the_tables_outside) {
  EXPECT_EQ(
      rewritten("select 1 from a,b where a.x*=b.x and b.i in (select i from t) and b.j in (select b.q from b where "
                "b.z=1) and b.k in (select k from t where t.k=a.k)"),
      "select 1 from a left join b on a.x = b.x and b.i in (select i from t) and b.j in (select b.q from b where b.z "
      "= 1) where b.k in (select k from t where t.k = a.k)");
}

TEST(OuterJoins, are_refused_where_they_have_no_one_meaning) {
  EXPECT_EQ(rewritten("select 1 from a,b where a.x*=q.x"), "4104");
  EXPECT_EQ(rewritten("select 1 from a,b where q.x*=b.x"), "4104");
  EXPECT_EQ(rewritten("select 1 from a,b,c where a.x*=b.x and b.y=c.y"), "303");
  EXPECT_EQ(rewritten("select 1 from a,b,c where a.x*=b.x and c.y<b.y"), "303");
  EXPECT_EQ(rewritten("select 1 from a,b where a.x*=b.x and b.y*=a.y"), "301");
  EXPECT_EQ(rewritten("select 1 from a,b where a.x*=b.x or 1=1"), "301");
  EXPECT_EQ(rewritten("select 1 from a,b where a.x*=x"), "301");
  EXPECT_EQ(rewritten("select 1 from a,b where a.x*=a.y"), "301");
  EXPECT_EQ(rewritten("select 1 from a join b on 1=1,c where a.x*=c.x"), "1016");
  EXPECT_EQ(rewritten("select 1 from a join b on a.x*=b.x"), "301");
}

TEST(OuterJoins, leave_everything_else_alone) {
  const String text = "select a.x from a, b left join c on b.x = c.x where a.x = b.x";
  EXPECT_EQ(rewritten(text), text);
  EXPECT_FALSE(hasOuterJoins(tokenize("select count(*)from t where x='*='")));
  EXPECT_TRUE(hasOuterJoins(tokenize("select 1 from a,b where a.x =* b.x")));
}

}  // namespace
}  // namespace QVSa::tsql
