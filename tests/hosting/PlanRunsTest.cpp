#include <filesystem>

#include "QVSa/hosting/PlanRuns.h"
#include "platform/Files.h"
#include "platform/Folders.h"
#include "tests/support/RecordingProvider.h"
#include "tests/support/Scene.h"

namespace QVSa::test {
namespace {

// A plan that keeps its backups for a day.
class RunsOfAPlan : public FilesScene {
 protected:
  void SetUp() override {
    FilesScene::SetUp();
    if (IsSkipped()) return;
    nextSecond();
    plan_.connect(server(), "QVApp");
    plan_.Name("nightly");
    plan_.bkPath(backups_.path().string());
    plan_.schedule()->timesOneDay(1);
    plan_.delFiles(true);
    plan_.delNum(1);
    ASSERT_TRUE(plan_.Save()) << plan_.errDescription();
    runs_.connect(server(), "QVApp");
  }
  // The machine's own time, which the folders have, a second further with each call.
  void nextSecond() { clock_.set(platform::lastModified(backups_.path().string())->addDays(++seconds_ / 86'400.0)); }
  static void makeOld(const PlanRun& run) {
    const auto folder = platform::localPath(run.folder);
    std::filesystem::last_write_time(folder, std::filesystem::last_write_time(folder) - std::chrono::hours(72));
  }
  // Runs the plan while the server answers the statement of this beginning with the failure.
  Boolean runWhile(const String& beginning, const Failure& failure, PlanRun& run) {
    RecordingProvider broken;
    broken.beforeEach([&](const String& event) {
      if (event.rfind(beginning, 0) == 0) throw failure;
    });
    return runs_.runPlan(plan_, run);
  }

  TestFolder backups_;
  BKPlan plan_;
  PlanRuns runs_;
  int seconds_ = 0;
};

TEST_F(RunsOfAPlan, TakeOldCopiesOnlyForAGoodOne) {
  PlanRun good;
  ASSERT_TRUE(runs_.runPlan(plan_, good)) << runs_.errDescription();
  EXPECT_EQ(good.state, PlanRun::done);
  makeOld(good);
  nextSecond();
  const Failure unreadable(number::statement, "SQL Server", "It can't be read.", 3013);
  PlanRun bad;
  EXPECT_FALSE(runWhile("restore verifyonly", unreadable, bad));
  EXPECT_EQ(runs_.errDescription(), "Backup DB failed.Database backup error.It can't be read.");
  EXPECT_EQ(bad.state, PlanRun::failed);
  EXPECT_TRUE(platform::folderExists(good.folder));
  EXPECT_TRUE(plan_.delFiles());
  makeOld(bad);
  nextSecond();
  PlanRun next;
  ASSERT_TRUE(runs_.runPlan(plan_, next)) << runs_.errDescription();
  EXPECT_FALSE(platform::folderExists(good.folder) || platform::folderExists(bad.folder));
  EXPECT_TRUE(platform::folderExists(next.folder));
}

TEST_F(RunsOfAPlan, CollideOverTheNumberOfTheirEntryWithoutLoss) {
  const Failure collision(number::integrity, "SQL Server", "Cannot insert duplicate key in object 'dbo.syslog'.", 2627);
  PlanRun run;
  EXPECT_TRUE(runWhile("insert into SysLog", collision, run)) << runs_.errDescription();
  EXPECT_EQ(run.state, PlanRun::done);
  EXPECT_EQ(tables_.text("select FuncName,OpDesc from syslog"),
            "Backup database|Backup database to [" + run.folder + "]");
  EXPECT_EQ(platform::foldersIn(backups_.path().string()).size(), 1U) << "one backup";
}

TEST_F(RunsOfAPlan, GoOneAtATimeAndOnce) {
  Connection other;
  other.Open(buildConnString(server(), "", false));
  other.Execute("begin transaction exec sp_getapplock N'run of plan 1','Exclusive'");
  PlanRun run;
  run.number = 1;
  EXPECT_FALSE(runs_.runPlan(plan_, run));
  EXPECT_EQ(runs_.errDescription(), "The backup plan is being run elsewhere.");
  other.Close();
  EXPECT_TRUE(runs_.runPlan(plan_, run)) << runs_.errDescription();
  EXPECT_FALSE(runs_.runPlan(plan_, run)) << "it is no longer pending";
  EXPECT_EQ(runs_.errNumber(), number::argument);
  plan_.bkPath("it's");
  PlanRun next;
  EXPECT_FALSE(runs_.runPlan(plan_, next));
  EXPECT_EQ(runs_.errNumber(), number::argument);
}

}  // namespace
}  // namespace QVSa::test
