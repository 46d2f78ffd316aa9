#include <filesystem>
#include <fstream>
#include <gtest/gtest.h>
#include <sstream>

#include "QVSa/values/Failure.h"
#include "providers/tsql/Dialect.h"
#include "tests/tsql/TreeText.h"

namespace QVSa::tsql {
namespace {

TEST(Dialect, is_printed_in_the_documents_as_it_is) {
  std::ifstream file(std::filesystem::path(QVSA_SOURCE_DIR) / "docs" / "dialect.md");
  std::stringstream text;
  text << file.rdbuf();
  EXPECT_NE(text.str().find("<!-- table -->\n" + dialectReference() + "<!-- end of the table -->\n"), String::npos)
      << "make docs prints it";
}

TEST(Dialect, finds_functions_without_regard_to_case_and_operators_by_their_form) {
  ASSERT_NE(functionNamed("CharIndex"), nullptr);
  EXPECT_EQ(functionNamed("soundex"), nullptr);
  EXPECT_EQ(operatorNamed("-", Form::sign)->least, 1U);
  EXPECT_EQ(operatorNamed("-", Form::sum)->least, 2U);
  EXPECT_EQ(operatorNamed("-", Form::product), nullptr);
}

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

TEST(Statement, select_takes_captions_in_every_form) {
  const auto statements = parseText("select a=b,c as d,e f,g as 'two words',[h]=i*2,count(*),t.*,* from t");
  EXPECT_EQ(treesOf(std::get<SelectPtr>(statements[0])->parts[0].core.items),
            " b:a c:d e:f g:two words (* i 2):h (count *) t.* *");
}

TEST(Statement, create_table_reads_column_options_in_any_order_and_keys_of_the_table) {
  const String table =
      "CREATE TABLE Roles (roleId int IDENTITY,n numeric(10,2) identity(5,-1) primary key,"
      "a nvarchar(50) NOT NULL DEFAULT '',b ntext NULL,c int constraint df default (-1) null unique nonclustered,"
      "d nvarchar(max),Primary key(roleId),constraint uq unique clustered (a desc,c))";
  EXPECT_EQ(print(parseText(table)[0]),
            "create table Roles (roleId int identity(1, 1), n numeric(10, 2) identity(5, -1) primary key, "
            "a nvarchar(50) not null default N'', b ntext null, c int null default -1 unique, d nvarchar(max), "
            "primary key (roleId), constraint uq unique (a, c))");
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

// Native number and text of the failure, or nothing where the batch is taken.
String refusal(const String& batch) {
  try {
    parseText(batch);
  } catch (const Failure& failure) {
    return std::to_string(failure.native()) + " " + failure.description();
  }
  return {};
}

// More of them, by their numbers alone, stand in refusals.test.
TEST(Refusal, names_the_word_that_does_not_fit) {
  EXPECT_EQ(refusal("select id frm t1"), "102 Incorrect syntax near 't1'.");
  EXPECT_EQ(refusal("select Desc from t"), "156 Incorrect syntax near the keyword 'Desc'.");
  EXPECT_EQ(refusal("select id from t where"), "102 Incorrect syntax near 'where'.");
  EXPECT_EQ(refusal("select id from t where u.deptid = <deptID>"), "102 Incorrect syntax near '<'.");
  EXPECT_EQ(refusal("select id from t where ( or name='a')"), "156 Incorrect syntax near the keyword 'or'.");
  EXPECT_EQ(refusal("selec * from t"), "102 Incorrect syntax near '*'.");
  EXPECT_EQ(refusal("select 1 sp_who"), "");
  EXPECT_EQ(refusal("set nocount on sp_who"), "102 Incorrect syntax near 'sp_who'.");
  EXPECT_EQ(refusal("select 1 where a and b=1"),
            "4145 An expression of non-boolean type specified in a context where a condition is expected, near 'and'.");
  EXPECT_EQ(refusal("select isnull(roleSpec) from roles"), "174 The isnull function requires 2 argument(s).");
  EXPECT_EQ(refusal("select LEN('a','b')"), "174 The len function requires 1 argument(s).");
  EXPECT_EQ(refusal("select charindex('a')"), "189 The charindex function requires 2 to 3 arguments.");
  EXPECT_EQ(refusal("select Soundx('a')"), "195 'Soundx' is not a recognized built-in function name.");
  EXPECT_EQ(refusal("select dateadd(fortnight,1,x)"), "155 'fortnight' is not a recognized dateadd option.");
  EXPECT_EQ(refusal("select top -1 a from t"), "1014 A TOP or FETCH clause contains an invalid value.");
  EXPECT_EQ(refusal("select @a"), "137 Must declare the scalar variable \"@a\".");
}

}  // namespace
}  // namespace QVSa::tsql
