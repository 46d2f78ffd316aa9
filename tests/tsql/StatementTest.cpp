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

TEST(Statement, select_takes_distinct_top_group_having_union_and_order) {
  const auto select = only<SelectPtr>(
      "select distinct top 5 a from t group by a,b having count(*)>1 union all select 1 union select 2 "
      "order by a desc,len(b) asc,3");
  EXPECT_EQ(treeOf(*select),
            " {distinct5 a from .t where - group a b having (> (count *) 1)} {all 1 from where - group having -} "
            "{ 2 from where - group having -} order a! (len b) 3");
  EXPECT_EQ(coreOf(only<SelectPtr>("select top (0) a from t")).top->text, "0");
  EXPECT_TRUE(coreOf(only<SelectPtr>("select top 10 percent a from t")).topPercent);
}

TEST(Statement, from_takes_lists_joins_and_derived_tables) {
  const auto from = [](const String& text) { return treesOf(coreOf(only<SelectPtr>("select * from " + text)).from); };
  EXPECT_EQ(from("a,db..b x,[c d] as y"), " .a db.b:x .c d:y");
  EXPECT_EQ(from("a join b on x=y left outer join c on 1=1 cross join d"),
            " (join4 (join1 (join0 .a .b (= x y)) .c (= 1 1)) .d -)");
  EXPECT_EQ(from("a join b right join c on 1=1 on 2=2"), " (join0 .a (join2 .b .c (= 1 1)) (= 2 2))");
  EXPECT_EQ(from("a full join (b inner join c on 1=1) on 2=2"), " (join3 .a (join0 .b .c (= 1 1)) (= 2 2))");
  const auto select = only<SelectPtr>("select * from (select 1,2) as f(a,b),(select 1 as c) g");
  EXPECT_EQ(coreOf(select).from[0]->columnNames, (std::vector<String>{"a", "b"}));
  EXPECT_EQ(coreOf(select).from[1]->alias, "g");
}

TEST(Statement, hints_stand_between_blanks_or_commas_and_with_or_without_with) {
  const auto select = only<SelectPtr>("select max(x) from idRec  with (ROWLOCK xlock, readpast), b (nolock) where x=1");
  EXPECT_EQ(treesOf(coreOf(select).from), " .idRec/rowlock/xlock/readpast .b/nolock");
  EXPECT_EQ(only<Update>("update t with (rowlock) set a=1").hints, std::vector<String>{"rowlock"});
}

TEST(Statement, insert_takes_rows_or_a_select_with_into_or_without) {
  const auto rows = only<Insert>("insert t(a,[b]) values (1,'x'),(getdate(),null)");
  EXPECT_EQ(rows.columns, (std::vector<String>{"a", "b"}));
  EXPECT_EQ(treesOf(rows.values), " ( 1 'x') ( (getdate) null)");
  const auto query = only<Insert>("insert into db..t select 4,a from b");
  EXPECT_EQ(query.table.database, "db");
  EXPECT_TRUE(query.columns.empty());
  EXPECT_EQ(coreOf(query.select).items.size(), 2U);
}

TEST(Statement, update_and_delete_name_their_target_by_table_or_alias) {
  const auto update = only<Update>("update a set a.path=b.path+'x',n=n-1 from d1 a,d1 b where a.id=b.up");
  EXPECT_EQ(update.target.name, "a");
  EXPECT_EQ(treesOf(update.assignments), " a.path=(+ b.path 'x') n=(- n 1)");
  EXPECT_EQ(treesOf(update.from), " .d1:a .d1:b");
  for (const char* text : {"delete t where a=1", "delete from t where a=1"})
    EXPECT_EQ(only<Delete>(text).target.name, "t");
  EXPECT_EQ(treesOf(only<Delete>("delete a from t a,u where a.x=u.x").from), " .t:a .u");
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

TEST(Statement, drop_names_its_kind_and_an_index_its_table) {
  EXPECT_EQ(only<Drop>("drop view v").kind, Drop::Kind::view);
  EXPECT_EQ(only<Drop>("drop synonym db..s").name.database, "db");
  EXPECT_EQ(only<Drop>("drop index i on t").table->name, "t");
}

TEST(Statement, session_statements_read_as_they_stand) {
  EXPECT_EQ(only<Use>("use [my db]").database, "my db");
  EXPECT_TRUE(only<SetOption>("SET NOCOUNT ON").on);
  EXPECT_EQ(only<SetOption>("SET NOCOUNT ON").option, "nocount");
  EXPECT_EQ(only<SetOption>(" set identity_insert roles off").table->name, "roles");
  EXPECT_EQ(only<Transaction>("begin transaction t1").kind, Transaction::Kind::begin);
  EXPECT_EQ(only<Transaction>("commit").kind, Transaction::Kind::commit);
  EXPECT_EQ(only<Transaction>("rollback tran").kind, Transaction::Kind::rollback);
  EXPECT_EQ(treesOf(only<Call>("sp_changedbowner N'QVUser',-1").arguments), " 'QVUser' (- 1)");
  EXPECT_EQ(only<Call>("execute db..p").procedure.database, "db");
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

TEST(Statement, administration_is_read_with_its_files) {
  EXPECT_TRUE(only<AlterDatabase>("alter database a set single_user with no_wait").noWait);
  EXPECT_FALSE(only<AlterDatabase>("alter database a set multi_user").singleUser);
  EXPECT_EQ(only<BackupDatabase>("backup database [a b] to disk='c' with init").file.text, "c");
  EXPECT_EQ(only<VerifyBackup>("restore verifyonly from disk=N'd''e'").file.text, "d'e");
  const auto restore =
      only<RestoreDatabase>("restore database a from disk='c' with move 'x' to 'y', move 'z' to 'w', replace");
  ASSERT_EQ(restore.moves.size(), 2U);
  EXPECT_EQ(restore.moves[1].name.text + restore.moves[1].file.text, "zw");
}

}  // namespace
}  // namespace QVSa::tsql
