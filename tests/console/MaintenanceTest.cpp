#include <filesystem>
#include <signal.h>
#include <thread>

#include "tests/console/Program.h"

namespace QVSa::test {
namespace {

class MaintenanceCommands : public Program {
 protected:
  MaintenanceCommands() { std::filesystem::create_directory(folder_.path() / "backups"); }
  String backups() const { return "'" + (folder_.path() / "backups").string() + "'"; }
};

TEST_F(MaintenanceCommands, BackUpRestoreAndUnlock) {
  execute("insert into reports(repId,repName) select 3,'a'");
  const Outcome backup = run("backup now --lock " + backups(), "Lock-pass-1\nLock-pass-1\n");
  ASSERT_EQ(backup.exitCode, 0) << backup.said << backup.document;
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
  EXPECT_EQ(run("plan list").document["plans"].size(), 1U);
  const Outcome ran = run("plan run nightly");
  ASSERT_EQ(ran.exitCode, 0) << ran.said << ran.document;
  const Json runs = run("plan history nightly").document["runs"];
  ASSERT_EQ(runs.size(), 2U);
  EXPECT_EQ(runs[0]["state"], "done");
  EXPECT_EQ(runs[1]["state"], "pending");
  EXPECT_EQ(run("plan remove nightly").exitCode, 0);
  EXPECT_EQ(run("plan show nightly").error(), "0x80040C1C");
}

TEST_F(MaintenanceCommands, TheAgentRunsWhatIsDueAndMendsBrokenChains) {
  ASSERT_EQ(run("plan add nightly " + backups()).exitCode, 0);
  execute("update QVTaskSche set pTime=dateadd(second,1,getdate())");
  execute("insert into tasks(taskName,taskType) values('foreign',7)");
  execute("insert into QVTaskSche(taskId,schNo,pTime) select 2,1,dateadd(second,1,getdate())");
  ASSERT_EQ(run("plan add broken " + backups()).exitCode, 0);
  execute("delete from QVTaskSche where taskId=3");
  const Outcome outcome = run("agent run --look 1 --for 3");
  ASSERT_EQ(outcome.exitCode, 0) << outcome.said << outcome.document;
  EXPECT_EQ(outcome.document["done"], 1) << outcome.said;
  EXPECT_EQ(value("select count(*) from QVTaskSche where taskId=1 and state=1"), "1");
  EXPECT_EQ(value("select count(*) from QVTaskSche where taskId=2 and state=0"), "1");
  EXPECT_EQ(value("select count(*) from QVTaskSche where taskId=3 and state=0"), "1");
}

TEST_F(MaintenanceCommands, TheAgentEndsCleanlyOnASignal) {
  const String ended = "sh -c '" + String(QVSA_CONSOLE) + " --json --server \"" + server() +
                       "\" agent run & sleep 0.5; kill -TERM $!; wait $!'";
  EXPECT_EQ(WEXITSTATUS(std::system(ended.c_str())), 0);
}

}  // namespace
}  // namespace QVSa::test
