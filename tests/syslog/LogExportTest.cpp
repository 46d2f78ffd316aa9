#include <filesystem>
#include <fstream>
#include <sstream>

#include "tests/support/FakeSession.h"
#include "tests/syslog/LogInstallation.h"

namespace QVSa {
namespace {

class LogExport : public test::LogInstallation {
 protected:
  String path(const String& name) const { return (folder_.path() / name).string(); }

  String content(const String& name) const {
    std::stringstream text;
    text << std::ifstream(path(name), std::ios::binary).rdbuf();
    return text.str();
  }

  void writeThree() const {
    const String columns = ",UserName,UserLogin,computer,FuncName,OpDesc";
    write("a", "20240305 10:20:45", columns, ",N'Zoë','zoe','pc','f',N'5 € – 中'", 1);
    write("b", "20240306", columns, ",'Bob','bob',null,'g','a' ", 2);
    write("c", "20240307", "", "", 5);
  }

  String left() const { return tables_.text("select logId from syslog order by logId"); }

  test::TestFolder folder_;
};

TEST_F(LogExport, IsALineAnEntryInTheSystemsCodePage) {
  writeThree();
  EXPECT_TRUE(log_.saveLog(path("log.txt"))) << log_.errDescription();
  EXPECT_EQ(content("log.txt"),
            "\r\n2024-03-05 10:20:45\tZo\xEB\tzoe\t1\tpc\tf\t5 \x80 \x96 ?"
            "\r\n2024-03-06 00:00:00\tBob\tbob\t2\t\tg\ta"
            "\r\n2024-03-07 00:00:00\t\t\t5\t\t\t");

  const test::EnvironmentLocale chinese{"zh_CN.UTF-8"};
  const Long type = 1;
  EXPECT_TRUE(log_.saveLog(path("log.txt"), &type));
  EXPECT_EQ(content("log.txt"), "\r\n2024-03-05 10:20:45\tZo?\tzoe\t1\tpc\tf\t5 \x80 \xA8\x43 \xD6\xD0");
}

TEST_F(LogExport, LeavesTheOldFileWhereItCannotBeDone) {
  if (test::onServer()) GTEST_SKIP() << "a file of the installation is among them";
  writeThree();
  std::ofstream(path("log.txt")) << "old";
  std::filesystem::create_directory(path("taken"));
  EXPECT_EQ(refusal(log_, log_.saveLog(path("taken"))), number::pathAccess);
  EXPECT_EQ(log_.errDescription(), "Error in saving system log." + runtimeFailure(number::pathAccess).description());
  EXPECT_EQ(refusal(log_, log_.saveLog(path("missing/log.txt"))), number::noPath);
  EXPECT_FALSE(log_.saveLog((installation_.folder() / "QVSys.db").string()));
  EXPECT_EQ(log_.errDescription(), "Error in saving system log.A file of an installation is not written over");
  EXPECT_EQ(left(), "a\nb\nc");

  // The rows stream: what was written before the second one fails is gone, and the third is never asked for.
  test::FakeServer server;
  const String much(100000, 'x');
  server.answer("select * from syslog",
                {{{"LogTime"}, {"UserName"}, {"UserLogin"}, {"LogType"}, {"Computer"}, {"FuncName"}, {"OpDesc"}},
                 {{"", "", "", 1, "", "", much}, {"", "", "", 1, "", "", Bytes{1}}, {"", "", "", 1, "", "", ""}}});
  EXPECT_EQ(refusal(log_, log_.saveLog(path("log.txt"))), number::type);
  EXPECT_EQ(server.fetchedRows, 2);
  EXPECT_TRUE(server.lastBatch.updatable) << "a dynamic cursor, of which nothing is kept";
  EXPECT_EQ(content("log.txt"), "old");
  EXPECT_EQ(std::distance(std::filesystem::directory_iterator(folder_.path()), {}), 2);
}

TEST_F(LogExport, HoldsEveryRowOfManyInOrder) {
  write("a", "20240305", ",OpDesc", ",'0'");
  for (int doubling = 0; doubling < 13; ++doubling)
    tables_.run(
        "insert into syslog(logId,logtype,LogTime,OpDesc) select logId,0,LogTime,(select count(*) from syslog)+OpDesc"
        " from syslog");
  ASSERT_TRUE(log_.saveLog(path("log.txt")));
  const String text = content("log.txt");
  std::size_t at = 0;
  int row = 0;
  for (; at < text.size(); ++row) {
    const String line = "\r\n2024-03-05 00:00:00\t\t\t0\t\t\t" + std::to_string(row);
    ASSERT_EQ(text.compare(at, line.size(), line), 0) << row;
    at += line.size();
  }
  EXPECT_EQ(row, 8192);
}

TEST_F(LogExport, ClearingDeletesOneTypeOrAll) {
  writeThree();
  ASSERT_TRUE(log_.GetAll(1, Date::empty(), Date::empty(), 0, "", "", "", 0, 2));
  Long type = 2;
  EXPECT_TRUE(log_.clearLog(&type));
  EXPECT_EQ(left(), "a\nc");
  EXPECT_EQ(log_.begin(), log_.end());
  type = 4;
  EXPECT_TRUE(log_.saveLog(path("log.txt"), &type));
  EXPECT_NE(content("log.txt"), "") << "no type, so all";
  EXPECT_TRUE(log_.clearLog(&type));
  EXPECT_EQ(left(), "");
}

TEST_F(LogExport, ClearingExportsFirstWhereToldToAndDeletesWhateverComesOfIt) {
  writeThree();
  const Boolean yes = true;
  const Boolean no = false;
  const String file = path("log.txt");
  const String unwritable = path("missing/log.txt");
  Long type = 1;
  EXPECT_TRUE(log_.clearLog(&type, &no, &file));
  EXPECT_FALSE(std::filesystem::exists(file));
  EXPECT_EQ(log_.errNumber(), 0);
  type = 2;
  EXPECT_TRUE(log_.clearLog(&type, &yes, &file));
  EXPECT_EQ(content("log.txt"), "\r\n2024-03-06 00:00:00\tBob\tbob\t2\t\tg\ta");
  EXPECT_TRUE(log_.clearLog(nullptr, &yes, &unwritable));
  EXPECT_EQ(left(), "");
  EXPECT_EQ(log_.errNumber(), number::noPath);
  EXPECT_EQ(log_.errDescription().find("Error in saving system log."), 0U);

  tables_.run("drop table syslog");
  EXPECT_EQ(refusal(log_, log_.clearLog()), number::noTable);
  EXPECT_EQ(log_.errDescription().find("Error in deleting system log."), 0U);
}

}  // namespace
}  // namespace QVSa
