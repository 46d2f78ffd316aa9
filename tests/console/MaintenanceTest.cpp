#include <filesystem>
#include <signal.h>
#include <thread>

#include "tests/console/Program.h"
#include "tests/support/PlainSession.h"

namespace QVSa::test {
namespace {

// The agent in the background, looking every second.
class RunningAgent {
 public:
  explicit RunningAgent(const String& server)
      : output_(popen(("echo $$; exec " + String(QVSA_CONSOLE) + " --json --server '" + server +
                       "' agent run --look 1 2>/dev/null")
                          .c_str(),
                      "r")) {
    EXPECT_EQ(std::fscanf(output_, "%d", &process_), 1);
  }
  void signal(int number) const { ::kill(process_, number); }
  Outcome end() {
    signal(SIGTERM);
    String output;
    for (int c; (c = std::fgetc(output_)) != EOF;) output += static_cast<char>(c);
    return {WEXITSTATUS(pclose(output_)), Json::parse(output, nullptr, false), ""};
  }

 private:
  FILE* output_;
  int process_ = 0;
};

class MaintenanceCommands : public Program {
 protected:
  MaintenanceCommands() { std::filesystem::create_directory(folder_.path() / "backups"); }
  // Within a time that a busy machine keeps, too.
  void expectSoon(const String& query, const String& expected) {
    for (int left = 200; left > 0 && value(query) != expected; --left)
      std::this_thread::sleep_for(std::chrono::milliseconds(100));
    EXPECT_EQ(value(query), expected);
  }
  String backups() const { return "'" + (folder_.path() / "backups").string() + "'"; }
};

TEST_F(MaintenanceCommands, BackUpRestoreAndUnlock) {
  EXPECT_EQ(run("backup now --lock " + backups(), "\n").exitCode, 2) << "a lock needs a password";
  EXPECT_EQ(run("backup now --lock " + backups(), "x\n").document["locked"], false) << "there is nothing to lock";
  execute("insert into reports(repId,repName) select 3,'a'");
  const Outcome backup = run("backup now --lock " + backups(), "Lock-pass-1\nLock-pass-1\n");
  ASSERT_EQ(backup.exitCode, 0) << backup.said << backup.document;
  EXPECT_EQ(backup.document["locked"], true);
  execute("delete from reports");
  EXPECT_EQ(run("backup restore " + backups(), "wrong\n").error(), "0x80040E4D");
  const Outcome restored = run("backup restore " + backups(), "Sa-first\n");
  ASSERT_EQ(restored.exitCode, 0) << restored.said << restored.document;
  EXPECT_EQ(value("select count(*) from reports"), "1");
  EXPECT_EQ(run("agent check").document["hiddenReports"], "3");
  EXPECT_EQ(run("backup unlock", "wrong\n").error(), "0x80040B5D");
  EXPECT_EQ(run("backup unlock", "Lock-pass-1\n").exitCode, 0);
  EXPECT_EQ(run("agent check").document["hiddenReports"], "");
}

TEST_F(MaintenanceCommands, KeepPlansAndTheirHistory) {
  const Outcome added =
      run("plan add nightly " + backups() + " --cycle weeks --weekdays mon,fri --at 03:15 --keep 2 --keep-unit weeks");
  ASSERT_EQ(added.exitCode, 0) << added.said << added.document;
  EXPECT_EQ(added.document["schedule"], "Occurs every [1] week(s) on [Monday, Friday], at [03:15:00]");
  EXPECT_EQ(added.document["kept"], "2 weeks");
  EXPECT_EQ(run("plan add odd " + backups() + " --weekdays noday").exitCode, 2);
  for (const char* repeat : {"-1", "24", "1440 --repeat-unit minutes"})
    EXPECT_EQ(run("plan add odd " + backups() + " --repeat " + repeat).exitCode, 2) << repeat;
  EXPECT_EQ(run("plan add twin " + backups() + "//").exitCode, 1) << "two runs of one second would share a folder";
  EXPECT_EQ(run("plan add odd /elsewhere --every 32767 --cycle weeks").exitCode, 1) << "it has no next run";
  EXPECT_EQ(run("plan list").document["plans"].size(), 1U);
  EXPECT_EQ(run("plan add bare /elsewhere --keep 0").document["kept"], "0 days") << "the last run alone";
  EXPECT_EQ(run("plan add all /else --cycle days").document["kept"], "for ever");
  const Outcome ran = run("plan run nightly");
  ASSERT_EQ(ran.exitCode, 0) << ran.said << ran.document;
  const Json runs = run("plan history nightly").document["runs"];
  ASSERT_EQ(runs.size(), 2U);
  EXPECT_EQ(runs[0]["state"], "done");
  EXPECT_EQ(runs[1]["state"], "pending");
  execute("update QVTaskSche set pTime='20200101' where state=0");
  EXPECT_TRUE(run("plan show nightly").document["next"].is_null()) << "that one was missed";
  EXPECT_EQ(run("plan remove nightly").exitCode, 0);
  EXPECT_EQ(run("plan show nightly").error(), "0x80040C1C");
}

TEST_F(MaintenanceCommands, TheAgentRunsAllThatIsDueOnceAndMendsBrokenChains) {
  // The first one's path would break the statement of a backup, and is refused; the second one's folder is missing.
  EXPECT_EQ(run("plan add failing \"it's\"").exitCode, 2);
  ASSERT_EQ(run("plan add failing " + backups()).exitCode, 0);
  execute("update QVBkPlan set path='it''s'");
  ASSERT_EQ(run("plan add lost /gone").exitCode, 0);
  ASSERT_EQ(run("plan add nightly " + backups()).exitCode, 0);
  execute("insert into tasks(taskName,taskType) values('foreign',7)");
  execute("insert into QVTaskSche(taskId,schNo) values(4,1)");
  ASSERT_EQ(run("plan add broken /elsewhere").exitCode, 0);
  execute("delete from QVTaskSche where taskId=5");
  RunningAgent agent(server());
  expectSoon("select count(*) from QVTaskSche where taskId=5", "1");
  // It sleeps over the moment and is late, but no run was missed.
  execute("update QVTaskSche set pTime=dateadd(second,2,getdate()) where taskId<5");
  agent.signal(SIGSTOP);
  std::this_thread::sleep_for(std::chrono::seconds(4));
  agent.signal(SIGCONT);
  expectSoon("select count(*) from QVTaskSche where state=1", "1");
  const Outcome outcome = agent.end();
  EXPECT_EQ(outcome.document["done"], 1);
  EXPECT_EQ(outcome.document["failed"], 2);
  EXPECT_EQ(PlainSession(server()).text("select taskId,schNo,state from QVTaskSche order by taskId,schNo"),
            "1|1|0\n1|2|0\n2|1|0\n2|2|0\n3|1|1\n3|2|0\n4|1|0\n5|1|0");
  EXPECT_EQ(value("select count(*) from syslog where opDesc like 'Backup database%'", "QVApp"), "1");
}

TEST_F(MaintenanceCommands, TheAgentOutlivesAFailureAndEndsCleanlyOnASignal) {
  ASSERT_EQ(run("plan add nightly " + backups()).exitCode, 0);
  // No moment of this one can be computed: it is left alone.
  ASSERT_EQ(run("plan add odd /elsewhere").exitCode, 0);
  execute("update tasks set cycle=7 where taskName='odd'");
  const auto broken = [&] { execute("delete from QVTaskSche"); };
  broken();
  RunningAgent agent(server());
  expectSoon("select count(*) from QVTaskSche", "1");
  const auto here = folder_.path() / name_;
  std::filesystem::rename(here, folder_.path() / "away");
  std::this_thread::sleep_for(std::chrono::milliseconds(1500));
  std::filesystem::rename(folder_.path() / "away", here);
  broken();
  expectSoon("select count(*) from QVTaskSche", "1");
  EXPECT_EQ(agent.end().exitCode, 0);
}

}  // namespace
}  // namespace QVSa::test
