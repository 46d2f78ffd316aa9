#include <filesystem>
#include <fstream>
#include <gtest/gtest.h>
#include <sstream>

#include "QVSa/values/Failure.h"
#include "providers/tsql/OuterJoins.h"
#include "providers/tsql/Printer.h"
#include "tests/tsql/TreeText.h"

namespace QVSa::tsql {
namespace {

const std::filesystem::path kSources = QVSA_SOURCE_DIR;

std::vector<String> linesOf(const std::filesystem::path& path) {
  std::vector<String> lines;
  std::ifstream file(path);
  for (String line; std::getline(file, line);) lines.push_back(line);
  return lines;
}

void expectSameAgain(const Statement& statement) {
  const String text = print(statement);
  const std::vector<Statement> again = parseText(text);
  ASSERT_EQ(again.size(), 1U) << text;
  EXPECT_EQ(treeOf(again[0]), treeOf(statement));
}

void expectRoundTrip(const String& batch) {
  SCOPED_TRACE(batch);
  for (Statement& statement : parseText(batch)) {
    expectSameAgain(statement);
    rewriteOuterJoins(statement);
    expectSameAgain(statement);
  }
}

TEST(Printer, brackets_names_that_would_read_as_something_else) {
  EXPECT_EQ(printName("deptId"), "deptId");
  EXPECT_EQ(printName("名称"), "名称");
  EXPECT_EQ(printName("order"), "[order]");
  EXPECT_EQ(printName("two words"), "[two words]");
  EXPECT_EQ(printName("a]b"), "[a]]b]");
  EXPECT_EQ(printName("1st"), "[1st]");
  EXPECT_EQ(printName("@v"), "[@v]");
}

TEST(Printer, writes_texts_as_unicode_and_sets_parentheses_where_they_matter) {
  EXPECT_EQ(print(parseText("SELECT 'O''Brien',((a+b))*c,a-(b-c) FROM t WHERE (a=1 AND b=2) OR ((c=3))")[0]),
            "select N'O''Brien', (a + b) * c, a - (b - c) from t where a = 1 and b = 2 or c = 3");
}

TEST(Printer, writes_odd_forms_so_that_they_read_the_same) {
  for (const char* batch : {
           "select -a*b,(-a)*b,a*(-b),a- -b,-(-a),- -1,~(a+b),~~a,~-a*b,-(a+b),+a,a-(b+c),(a-b)-c,a/(b*c)",
           "select 1 where not (not a=b) and (a=1 or b=2) and not (c=1 and d=2) or (e=1 or (f=2 or g=3))",
           "select 1 where a in ((1),2) and a in (1,-2) and a in ((-1)) and a in (null,'x') and a in ((select 1))",
           "select 1 where (select 1)=a and (a+b) like (c+'%') escape ('!') and a between (b-1) and b+1",
           "select [select]=1,[a b] as [c]]d],'x' as 'y z',[len]=len([len]) from [from] [as]",
           "select 1 from a join b join c on 1=1 on 2=2 cross join (d left join e on 3=3)",
           "select case (select 1) when 1 then case when a=b or c=d then 1 end else -1 end",
           "select cast(-1 as decimal(5,2)),convert(nvarchar(max),'x'),count(distinct a+1),dateadd(mi,-1,getdate())",
           "create table [t t] (a int default -1+2 null,b [my type](3) default (getdate()) not null primary key)",
           "exec p null,-1,0xFF,1.5e3,'x'",
       })
    expectRoundTrip(batch);
}

// One batch a line: the statements that the system sends, with values in their places.
TEST(Printer, prints_what_the_system_sends_so_that_it_reads_the_same) {
  const auto statements = linesOf(kSources / "tests/tsql/statements.txt");
  ASSERT_GT(statements.size(), 100U);
  for (const String& statement : statements) expectRoundTrip(statement);
}

TEST(Printer, prints_the_database_scripts_so_that_they_read_the_same) {
  for (const char* name : {"QVSys.sql", "QVSys.2.sql", "QVApp.sql", "QVUpdate.sql"}) {
    std::ostringstream script;
    script << std::ifstream(kSources / "database" / name).rdbuf();
    const auto batches = splitScript(script.str());
    EXPECT_FALSE(batches.empty()) << name;
    for (const String& batch : batches) expectRoundTrip(batch);
  }
}

TEST(Printer, prints_the_recorded_cases_so_that_they_read_the_same) {
  const auto folder = kSources.parent_path() / "shared" / "tsql";
  if (!std::filesystem::exists(folder)) GTEST_SKIP() << "no recorded cases beside the source tree";
  for (const auto& entry : std::filesystem::directory_iterator(folder)) {
    const auto lines = linesOf(entry.path());
    for (std::size_t i = 0; i + 1 < lines.size(); ++i) {
      if (lines[i] == "statement ok" || lines[i] == "query") expectRoundTrip(lines[i + 1]);
      // Only what the parser itself refuses; other errors are found later.
      if (lines[i].starts_with("statement error 1")) {
        EXPECT_THROW(parseText(lines[i + 1]), Failure) << lines[i + 1];
      }
    }
  }
}

}  // namespace
}  // namespace QVSa::tsql
