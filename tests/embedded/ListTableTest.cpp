#include <gtest/gtest.h>

#include "providers/embedded/functions/ListTable.h"
#include "tests/embedded/ScratchHandle.h"

namespace QVSa::embedded {
namespace {

class ListTable : public testing::Test {
 protected:
  ListTable() {
    scratch_.run("create table t(id integer primary key, name text collate tsql, n integer)");
    scratch_.run("create index byName on t(name)");
    scratch_.run("create index byN on t(n)");
    scratch_.run(
        "with recursive c(i) as (select 1 union all select i+1 from c where i<1000) "
        "insert into t select i, 'name' || i, i*10 from c");
  }

  static std::string idsOf(Prepared& query, ValueList values) {
    query.bind(1, std::make_shared<const ValueList>(std::move(values)));
    std::string ids;
    while (query.step()) ids += shown(query.column(0)) + " ";
    query.reset();
    return ids;
  }

  std::string planOf(const std::string& text) {
    Prepared query(scratch_.get(), "explain query plan " + text);
    std::string plan;
    while (query.step()) plan += shown(query.column(3)) + "\n";
    return plan;
  }

  ScratchHandle scratch_;
};

TEST_F(ListTable, OneStatementTakesListsOfAnyLength) {
  Prepared query(scratch_.get(), "select id from t where n in (select value from list(?)) order by id");
  EXPECT_EQ(idsOf(query, {std::int64_t{20}, std::int64_t{5000}, std::int64_t{11}}), "2 500 ");
  EXPECT_EQ(idsOf(query, {}), "");
  EXPECT_EQ(idsOf(query, {Value(), 30.0}), "3 ");
  ValueList many;
  for (std::int64_t i = 0; i < 50'000; ++i) many.push_back(i);
  EXPECT_EQ(idsOf(query, std::move(many)).substr(0, 8), "1 2 3 4 ");
}

TEST_F(ListTable, TextsCompareByTheColumnsCollation) {
  Prepared query(scratch_.get(), "select id from t where name in (select value from list(?)) order by id");
  EXPECT_EQ(idsOf(query, {std::string("NAME7 "), std::string("name8"), std::string("nobody")}), "7 8 ");
  Prepared none(scratch_.get(), "select count(*) from t where name not in (select value from list(?))");
  EXPECT_EQ(idsOf(none, {std::string("NAME7"), std::string("Name8")}), "998 ");
}

TEST_F(ListTable, TheIndexOfTheOtherTableIsUsed) {
  EXPECT_NE(planOf("select id from t where n in (select value from list(?))").find("SEARCH t USING"),
            std::string::npos);
  EXPECT_NE(planOf("select id from t where name in (select value from list(?))").find("byName"), std::string::npos);
  EXPECT_NE(planOf("select id from t, list(?) l where t.n=l.value").find("SEARCH t USING"), std::string::npos);
  EXPECT_NE(planOf("select id from t where id in (select value from list(?))").find("PRIMARY KEY"), std::string::npos);
}

}  // namespace
}  // namespace QVSa::embedded
