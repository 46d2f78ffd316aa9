#include <chrono>
#include <filesystem>
#include <thread>

#include "tests/processes/Worker.h"
#include "tests/support/Scene.h"

namespace QVSa::test {
namespace {

using std::chrono::steady_clock;

class BackupsAmongProcesses : public Scene {
 protected:
  static constexpr const char* password = TestInstallation::administratorPassword;

  // Files of a pair with this name.
  String sys(const String& name) const { return (folder_.path() / (name + "-sys.bak")).string(); }
  String app(const String& name) const { return (folder_.path() / (name + "-app.bak")).string(); }
  void backUp(const String& name) {
    ASSERT_TRUE(manager_.BackUpDB(server(), sys(name), app(name))) << manager_.errDescription();
  }
  void restore(const String& name) {
    ASSERT_TRUE(manager_.RestoreDB(server(), sys(name), app(name), password)) << manager_.errDescription();
  }
  Worker restoring(const String& name) const { return Worker("restore", {server(), sys(name), app(name), password}); }
  Worker backingUp(const String& name, const std::vector<std::string>& more = {}) const {
    std::vector<std::string> words{server(), sys(name), app(name)};
    words.insert(words.end(), more.begin(), more.end());
    return Worker("back-up", words);
  }
  // Both databases say the word in many rows.
  void say(const String& word) {
    for (const PlainSession* database : {&system_, &tables_}) {
      database->run("delete from word");
      database->run("insert into word(w) values('" + word + "')");
      for (int i = 0; i < 11; ++i) database->run("insert into word(w) select w from word");
    }
  }
  void makeWords() {
    for (const PlainSession* database : {&system_, &tables_}) database->run("create table word (w nvarchar(20) null)");
  }

  TestFolder folder_;
  DBMgr manager_;
  PlainSession system_{installation_.server(), "QVSys"};
};

TEST_F(BackupsAmongProcesses, AreOneStateOfADatabaseThatIsWrittenTo) {
  addUser("ann");
  system_.run("create table pair (id int not null primary key, n int null)");
  system_.run("insert into pair(id,n) select 1,0 union all select 2,0");
  std::vector<Worker> writers;
  for (int i = 0; i < 2; ++i) writers.emplace_back("write", std::vector<std::string>{server()});
  for (Worker& writer : writers) writer.go();
  for (Worker& writer : writers) ASSERT_EQ(writer.line(), "writing");
  for (const char* name : {"1", "2", "3"}) backUp(name);
  for (Worker& writer : writers) {
    writer.kill();
    EXPECT_EQ(writer.lines(), Lines()) << "nobody who works notices a backup";
  }
  for (const char* name : {"1", "2", "3"}) {
    restore(name);
    EXPECT_EQ(system_.text("select count(*) from pair group by n"), "2") << name;
    EXPECT_GT(std::stoi(system_.text("select n from pair where id=1")), 0);
  }
}

TEST_F(BackupsAmongProcesses, KilledInTheMiddleOfARestoreLeaveTheOldDatabaseOrTheNewOne) {
  makeWords();
  say("old");
  backUp("old");
  say("new");
  backUp("new");
  Worker whole = restoring("new");
  const auto before = steady_clock::now();
  whole.go();
  ASSERT_EQ(whole.line(), "done");
  const auto duration = steady_clock::now() - before;
  int changed = 0;
  constexpr int moments = 20;
  constexpr int latest = 20 * moments;
  // On a machine that is busy by now the first kills may all come too early.
  for (int moment = 1; moment <= moments || (changed == 0 && moment <= latest); ++moment) {
    restore("old");
    Worker worker = restoring("new");
    worker.go();
    std::this_thread::sleep_for(duration * moment / moments);
    worker.kill();
    // Nothing of the dead process holds the databases.
    const String inSystem = system_.text("select distinct w from word");
    const String inApplication = tables_.text("select distinct w from word");
    EXPECT_TRUE(inSystem == "old" || inSystem == "new") << inSystem;
    EXPECT_TRUE(inApplication == "old" || (inApplication == "new" && inSystem == "new")) << inApplication;
    changed += inSystem == "new";
    backUp("check");
  }
  EXPECT_GT(changed, 0) << "no kill came late enough";
}

TEST_F(BackupsAmongProcesses, KilledOrWithoutRoomLeaveTheOldFilesWhole) {
  makeWords();
  say("old");
  backUp("x");
  say("new");
  const auto files = [&] { return std::distance(std::filesystem::directory_iterator(folder_.path()), {}); };
  Worker full = backingUp("x", {"50000"});
  full.go();
  EXPECT_NE(full.line().find("BACKUP DATABASE is terminating abnormally."), String::npos);
  EXPECT_EQ(files(), 2);
  restore("x");
  EXPECT_EQ(tables_.text("select distinct w from word"), "old");

  Worker whole = backingUp("x");
  const auto before = steady_clock::now();
  whole.go();
  ASSERT_EQ(whole.line(), "done");
  const auto duration = steady_clock::now() - before;
  constexpr int moments = 20;
  for (int moment = 1; moment <= moments; ++moment) {
    Worker worker = backingUp("x");
    worker.go();
    std::this_thread::sleep_for(duration * moment / moments);
    worker.kill();
    for (const String& file : {sys("x"), app("x")}) tables_.run("restore verifyonly from disk='" + file + "'");
  }
  backUp("x");
  EXPECT_EQ(files(), 2) << "what the killed ones left is gone";
}

}  // namespace
}  // namespace QVSa::test
