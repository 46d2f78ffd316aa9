#include <filesystem>

#include "console/commands/ClassTree.h"
#include "tests/console/Program.h"

namespace QVSa::console {
namespace {

using test::Outcome;

class LogAndClasses : public test::Program {
 protected:
  String names(const Outcome& outcome) {
    String result;
    for (const Json& node : outcome.document["classes"]) result += node["fullName"].get<String>() + " ";
    return result;
  }
  String functions(const Outcome& outcome) {
    String result;
    for (const Json& entry : outcome.document["entries"]) result += entry["operation"].get<String>() + " ";
    return result;
  }
};

TEST_F(LogAndClasses, EntriesAreWrittenFoundPagedExportedAndCleared) {
  for (const char* entry : {"one 'first words' --type 1", "two other --type 1 --record r2", "three third"})
    ASSERT_EQ(run(String("log add ") + entry).exitCode, 0);
  execute("update QVApp..syslog set LogTime='20240305' where FuncName='one'");
  EXPECT_EQ(functions(run("log list --type 1")), "two one ");
  EXPECT_EQ(functions(run("log list")), "three ");
  EXPECT_EQ(functions(run("log list --type 1 --to 2024-03-05 --user Admin --words words")), "one ");
  EXPECT_EQ(functions(run("log query --type 1 --users dmi,nobody")), "two one ");
  const Outcome page = run("log list --type 1 --page-size 1");
  EXPECT_EQ(functions(page), "two ");
  const Outcome last = run("log list --type 1 --page-size 1 --after " + page.document["next"].get<String>());
  EXPECT_EQ(functions(last), "one ");
  EXPECT_TRUE(last.document["next"].is_null());
  for (const char* misuse :
       {"log list --from yesterday", "log clear", "log clear --all --type 1", "log export x --type 4"})
    EXPECT_EQ(run(misuse).exitCode, 2) << misuse;

  const String file = (folder_.path() / "log.txt").string();
  const Outcome exported = run("log export '" + folder_.path().string() + "\\log.txt' --type 1");
  EXPECT_EQ(exported.document["bytes"], std::filesystem::file_size(file));
  EXPECT_EQ(run("log export /dev/null").document["bytes"], nullptr);
  EXPECT_EQ(run("log clear --type 1 --export '" + folder_.path().string() + "'").exitCode, 1);
  EXPECT_EQ(value("select count(*) from QVApp..syslog"), "3") << "what could not be exported stays";
  EXPECT_EQ(run("log clear --type 1 --export '" + file + "'").exitCode, 0);
  EXPECT_EQ(run("log clear --all").exitCode, 0);
  EXPECT_EQ(value("select count(*) from QVApp..syslog"), "0");
}

TEST_F(LogAndClasses, ClassesAreKeptAsATree) {
  for (const char* node : {"A", "B", "A1 --under A", "A2 --under A", "A11 --under A1"})
    ASSERT_EQ(run(String("class add ") + node).exitCode, 0);
  EXPECT_EQ(names(run("class order B A")), "B A A,A1 A,A2 A,A1,A11 ");
  EXPECT_EQ(run("class order A").exitCode, 2);
  EXPECT_EQ(names(run("class rename A1 First")), "B A A,First A,A2 A,First,A11 ") << "it keeps its place";
  EXPECT_EQ(value("select superClass from RptDirectory where class='A11'"), "First");
  EXPECT_EQ(run("class move A A11").exitCode, 1) << "below itself";
  EXPECT_EQ(run("class move A11").exitCode, 2);
  EXPECT_EQ(names(run("class move First B")), "B A B,First A,A2 B,First,A11 ");
  EXPECT_EQ(names(run("class move First --to-top")), "B A First A,A2 First,A11 ");
  EXPECT_EQ(run("class remove First").exitCode, 1);
  EXPECT_EQ(run("class remove nothing").exitCode, 1);
  EXPECT_EQ(run("class remove First --cut-off").exitCode, 0);
  EXPECT_EQ(names(run("class rename A11 Eleven")), "B A Eleven A,A2 ") << "what was cut off has no place";
  EXPECT_EQ(run("class order Eleven --under First").exitCode, 1);
  execute("insert into RptDirectory(class,superClass,path,fullName) values('x,y','','.x,y.','x,y')");
  for (const char* misuse :
       {"class add C.D", "class rename A ''", "class rename A a,b", "class order A B x,y", "class rename A C"})
    EXPECT_EQ(run(misuse).exitCode, 2) << misuse;
  EXPECT_EQ(value("select count(*) from RptDirectory where class in ('A','B','x,y')"), "3");
  EXPECT_EQ(value("select CreUName+UpdUName from RptDirectory where class='B'"),
            value("select userName+userName from users where userLogin='Admin'"));
}

TEST_F(LogAndClasses, TheRuleAndTheTemplatePasswordAreSet) {
  EXPECT_TRUE(run("acl show").document["rule"].is_null());
  run("acl set --rw-type 2 --design-roles 3");
  const Json rule = run("acl set --rw-roles -1").document["rule"];
  EXPECT_EQ(rule["readWriteType"], 2);
  EXPECT_EQ(rule["readWriteRoles"], -1);
  EXPECT_EQ(rule["designRoles"], 3);

  EXPECT_EQ(run("template-password Secret", "x\n").exitCode, 2);
  EXPECT_EQ(run("template-password", "Secret 1\n").exitCode, 0);
  EXPECT_NE(value("select protectPwd from QVTmpSafe"), "");
}

TEST(ClassTree, IsDrawnByThePathsWhateverTheOrderOfTheListing) {
  const auto classes = readClasses(
      R"(<ds><d super="" path=".A.">A</d><d super="gone" path=".C.">C</d><d super="A" path=".A.B.">B</d>)"
      R"(<d super="A" path=".A.D.">D</d><d super="B" path=".A.B.E.">E</d><d super="X" path=".X.F.">F</d></ds>)");
  EXPECT_EQ(drawTree(classes), "├─ A\n│  ├─ B\n│  │  └─ E\n│  └─ D\n├─ C\n└─ F\n");
}

}  // namespace
}  // namespace QVSa::console
