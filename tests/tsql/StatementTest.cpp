#include <gtest/gtest.h>

#include "tests/tsql/TreeText.h"

namespace QVSa::tsql {
namespace {

template <typename Kind>
Kind only(const String& batch) {
  std::vector<Statement> statements = parseText(batch);
  EXPECT_EQ(statements.size(), 1U);
  return std::get<Kind>(std::move(statements.at(0)));
}

const SelectCore& coreOf(const SelectPtr& select) { return select->parts.at(0).core; }

TEST(Statement, select_takes_captions_in_every_form) {
  const auto select = only<SelectPtr>("select a=b,c as d,e f,g as 'two words',[h]=i*2,count(*),t.*,* from t");
  EXPECT_EQ(treesOf(coreOf(select).items), " b:a c:d e:f g:two words (* i 2):h (count *) t.* *");
}

TEST(Statement, create_table_reads_column_options_in_any_order_and_keys_of_the_table) {
  const auto table = only<CreateTable>(
      "CREATE TABLE Roles (roleId int IDENTITY,n numeric(10,2) identity(5,-1) primary key,"
      "a nvarchar(50) NOT NULL DEFAULT '',b ntext NULL,c int constraint df default (-1) null unique nonclustered,"
      "d nvarchar(max),Primary key(roleId),constraint uq unique clustered (a desc,c))");
  EXPECT_EQ(print(Statement(only<CreateTable>("create table t (a int constraint pk primary key clustered)"))),
            "create table t (a int primary key)");
  ASSERT_EQ(table.columns.size(), 6U);
  EXPECT_TRUE(table.columns[0].identity);
  EXPECT_EQ(table.columns[0].seed, 1);
  EXPECT_FALSE(table.columns[0].nullable.has_value());
  EXPECT_EQ(table.columns[1].seed, 5);
  EXPECT_EQ(table.columns[1].increment, -1);
  EXPECT_TRUE(table.columns[1].primaryKey);
  EXPECT_EQ(table.columns[2].nullable, false);
  EXPECT_EQ(treeOf(table.columns[2].defaultValue), "''");
  EXPECT_EQ(table.columns[3].nullable, true);
  EXPECT_EQ(treeOf(table.columns[4].defaultValue), "(- 1)");
  EXPECT_TRUE(table.columns[4].unique);
  EXPECT_EQ(table.columns[5].type.size, -1);
  ASSERT_EQ(table.keys.size(), 2U);
  EXPECT_TRUE(table.keys[0].primary);
  EXPECT_EQ(table.keys[1].name, "uq");
  EXPECT_EQ(table.keys[1].columns, (std::vector<String>{"a", "c"}));
}

TEST(Statement, create_reads_views_with_common_tables_indices_synonyms_and_logins) {
  const auto view = only<CreateView>(
      "create view v(x,y) as with t(a,b) as (select 1,2 union all select a+1,b from t) select * from t");
  EXPECT_EQ(view.columns.size(), 2U);
  EXPECT_EQ(view.select->with.at(0).columns, (std::vector<String>{"a", "b"}));
  EXPECT_EQ(view.select->with.at(0).select->parts.size(), 2U);
  const auto index = only<CreateIndex>("create unique clustered index i on db..t (a desc,b)");
  EXPECT_TRUE(index.unique);
  EXPECT_EQ(index.columns, (std::vector<String>{"a", "b"}));
  EXPECT_EQ(only<CreateSynonym>("create synonym a for db..b").target.database, "db");
  EXPECT_EQ(only<CreateLogin>("create login u with password=N'it''s', check_policy=off").password.text, "it's");
}

TEST(Statement, statements_follow_each_other_with_semicolons_or_without) {
  EXPECT_EQ(parseText("set nocount on select a from t insert t values (1) update t set a=1 delete t use x").size(), 6U);
  EXPECT_EQ(parseText(";;select 1;begin tran;select 2 commit;").size(), 4U);
  EXPECT_TRUE(parseText(" -- nothing\n").empty());
}

TEST(Script, is_cut_at_lines_that_hold_go_alone) {
  EXPECT_EQ(splitScript("select 1\n GO \r\ngo\nselect 'go'\ngo2\nGo"),
            (std::vector<String>{"select 1\n", "select 'go'\ngo2\n"}));
  EXPECT_TRUE(splitScript("\n go\n").empty());
}

}  // namespace
}  // namespace QVSa::tsql
