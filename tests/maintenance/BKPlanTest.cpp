#include <filesystem>
#include <fstream>

#include "platform/Files.h"
#include "platform/Folders.h"
#include "platform/NewFile.h"
#include "tests/support/Failures.h"
#include "tests/support/RecordingProvider.h"
#include "tests/support/Scene.h"

namespace QVSa::test {
namespace {

namespace fs = std::filesystem;

// A plan, every second day at ten, on the morning of 7 March 2024.
class BackupPlans : public FilesScene {
 protected:
  BKPlan plan(const String& name) {
    auto plan = connected<BKPlan>();
    plan.Name(name);
    plan.bkPath(path());
    plan.schedule()->cycleNum(2);
    plan.schedule()->timesOneDay(1);
    plan.schedule()->StartTime(*Date::parse("10:30"));
    return plan;
  }
  BKPlan saved(const String& name) {
    BKPlan result = plan(name);
    EXPECT_TRUE(result.Save()) << result.errDescription();
    return result;
  }
  String path() const { return backups_.path().string(); }
  String runs() const {
    return tables_.text("select taskId,schNo,pTime,state,msg from QVTaskSche order by taskId,schNo");
  }
  // A folder that looks like a backup, three days old.
  fs::path oldBackup(const String& stamp, const std::vector<String>& files = {"sys.bak", "app.bak"}) {
    const fs::path folder = backups_.path() / stamp;
    fs::create_directory(folder);
    for (const String& file : files) std::ofstream(folder / file) << "x";
    fs::last_write_time(folder, fs::file_time_type::clock::now() - std::chrono::hours(72));
    return folder;
  }
  // Records a folder as that of a run.
  void record(Long task, Long run, const String& stamp) {
    tables_.run("insert into QVTaskSche(taskId,schNo,pTime,state,msg) values(" + std::to_string(task) + "," +
                std::to_string(run) + ",getdate(),1,N'" + path() + "\\" + stamp + "')");
  }
  // The machine's own time, which the folders have.
  Date realTime() const {
    fs::last_write_time(backups_.path(), fs::file_time_type::clock::now());
    return *platform::lastModified(path());
  }

  TestFolder backups_;
};

TEST_F(BackupPlans, AreStoredAndLoadedAgain) {
  BKPlan first = plan("nightly");
  first.schedule()->cycle(1);
  first.schedule()->wks("1010000");
  first.schedule()->monthDay(4);
  first.schedule()->interval(5);
  first.schedule()->valUnit(1);
  first.delFiles(true);
  first.delNum(3);
  first.delUnit(2);
  ASSERT_TRUE(first.Save()) << first.errDescription();
  EXPECT_EQ(first.Id(), 1);
  EXPECT_EQ(tables_.text("select delOld from QVBkPlan"), "-1");
  saved("weekly");

  tables_.run("update tasks set startTime='20240307 10:30' where taskName='nightly'");
  BKPlan found = connected<BKPlan>();
  for (const auto& [key, value] : {std::pair<Integer, String>{1, "1"}, {2, "NIGHTLY"}, {0, ""}}) {
    ASSERT_TRUE(found.GetOne(key, value)) << found.errDescription();
    EXPECT_EQ(found.Name(), "nightly");
    EXPECT_EQ(found.bkPath(), path());
    EXPECT_TRUE(found.delFiles());
    EXPECT_EQ(found.delNum() * 10 + found.delUnit(), 32);
    cSchedule& when = *found.schedule();
    EXPECT_EQ(when.wks(), "1010000");
    EXPECT_EQ(when.StartTime(), *Date::parse("10:30")) << "a stored day is cut";
    EXPECT_EQ(when.cycle() * 1000 + when.cycleNum() * 100 + when.monthDay() * 10 + when.interval(), 1245);
    EXPECT_EQ(when.valUnit() + when.timesOneDay(), 2);
  }
  EXPECT_EQ(refusal(found, found.GetOne(1, "")), messageNumber(3100));
  EXPECT_EQ(found.errDescription(), "Can not find the backup plan.");

  BKPlan twin = plan("Weekly");
  EXPECT_EQ(refusal(twin, twin.Save()), number::integrity);
  EXPECT_EQ(twin.errDescription(), "The name of backup plan is dulplicate.");

  // No day of it can be computed, nor its unit be named.
  BKPlan odd = plan("odd");
  odd.schedule()->cycle(1);
  odd.schedule()->wks("x");
  EXPECT_TRUE(odd.Save());
  EXPECT_EQ(odd.errNumber(), number::type);
  odd.schedule()->wks("1");
  odd.schedule()->timesOneDay(0);
  odd.schedule()->valUnit(9);
  EXPECT_TRUE(odd.Save());
  EXPECT_EQ(odd.errNumber(), number::argument);
  EXPECT_EQ(tables_.text("select schDesc from tasks where taskName='odd'"), "");
  odd.schedule()->valUnit(1);
  BKPlan mended = connected<BKPlan>();
  mended.Name("mended");
  mended.schedule(odd.schedule());
  EXPECT_TRUE(mended.Save());
  EXPECT_EQ(mended.errNumber(), 0) << "an earlier failure is none of this save";
}

TEST_F(BackupPlans, HaveOnePendingRunAndKeepTheFinishedOnes) {
  BKPlan nightly = saved("nightly");
  EXPECT_EQ(runs(), "1|1|2024-03-07 10:30:00|0|-");
  tables_.run("update QVTaskSche set state=1");
  nightly.schedule()->StartTime(*Date::parse("09:00"));
  ASSERT_TRUE(nightly.Save());
  ASSERT_TRUE(nightly.Save());
  EXPECT_EQ(runs(), "1|1|2024-03-07 10:30:00|1|-\n1|2|2024-03-09 09:00:00|0|-");
  nightly.newSche();
  EXPECT_EQ(tables_.text("select count(*) from QVTaskSche"), "2") << "a run is pending";
  clock_.set(Date(2024, 3, 10, 8, 0, 0));
  nightly.newSche();
  EXPECT_EQ(runs(), "1|1|2024-03-07 10:30:00|1|-\n1|2|2024-03-09 09:00:00|0|-\n1|3|2024-03-10 09:00:00|0|-")
      << "the pending one was missed";

  saved("other");
  nightly.delFiles(true);
  nightly.delNum(5);
  nightly.delUnit(1);
  ASSERT_TRUE(nightly.Save());
  EXPECT_EQ(tables_.text("select path,delOld,delNum,delUnit from QVBkPlan order by taskId"),
            path() + "|-1|5|1\n" + path() + "|0|0|0");
  EXPECT_TRUE(nightly.Delete(2));
  EXPECT_EQ(tables_.text("select taskId from tasks"), "1");
  EXPECT_TRUE(nightly.Delete());
  EXPECT_EQ(tables_.text("select count(*) from tasks") + tables_.text("select count(*) from QVBkPlan") + runs(), "00");
}

TEST_F(BackupPlans, RunIntoAFolderOfTheirOwnAndQueueTheNextRun) {
  BKPlan nightly = saved("nightly");
  clock_.set(Date(2024, 3, 7, 10, 30, 0));
  {
    // The next run is counted from the beginning of this one, which takes two days.
    RecordingProvider slow;
    slow.beforeEach([&](const String& event) {
      if (event.rfind(" backup database", 0) == 0) clock_.set(Date(2024, 3, 9, 11, 0, 0));
    });
    ASSERT_TRUE(nightly.exec(1)) << nightly.errDescription();
  }
  const String folder = path() + "\\20240307103000";
  EXPECT_EQ(runs(), "1|1|2024-03-07 10:30:00|1|" + folder + "\n1|2|2024-03-09 10:30:00|0|-");
  EXPECT_TRUE(fs::exists(backups_.path() / "20240307103000" / "sys.bak"));
  EXPECT_TRUE(fs::exists(backups_.path() / "20240307103000" / "app.bak"));
  EXPECT_EQ(tables_.text("select logId,logType,LogTime,userId,UserName,Computer,FuncName,OpDesc from syslog"),
            "24030900000001|3|2024-03-09 11:00:00|1||" + platform::services().computerName() +
                "|Backup database|Backup database to [" + folder + "]");
}

TEST_F(BackupPlans, GoOnWhereABackupFails) {
  BKPlan nightly = saved("nightly");
  nightly.delFiles(true);
  nightly.delNum(0);
  clock_.set(realTime());
  const fs::path old = oldBackup("20200101000000");
  record(1, 7, "20200101000000");
  {
    RecordingProvider full;
    full.beforeEach([](const String& event) {
      if (event.rfind("restore verifyonly", 0) == 0)
        throw Failure(number::statement, "SQL Server", "There is no room.", 3013);
    });
    EXPECT_FALSE(nightly.exec(1));
  }
  EXPECT_EQ(nightly.errNumber(), messageNumber(2906));
  EXPECT_EQ(nightly.errDescription(), "Backup DB failed.Database backup error.There is no room.");
  const String folder = tables_.text("select msg from QVTaskSche where schNo=1");
  EXPECT_EQ(folder.substr(0, path().size() + 3), path() + "\\20");
  EXPECT_EQ(tables_.text("select schNo,state,msg from QVTaskSche where schNo<7 order by schNo"),
            "1|2|" + folder + "\n2|0|-");
  EXPECT_EQ(tables_.text("select OpDesc from syslog"), nightly.errDescription());
  EXPECT_FALSE(fs::exists(old)) << "the cleaning takes place";
  EXPECT_TRUE(platform::folderExists(folder));
  clock_.set(realTime().addDays(1));
  EXPECT_TRUE(nightly.exec(2));
  EXPECT_FALSE(platform::folderExists(folder)) << "it holds both files";
}

TEST_F(BackupPlans, WithoutAFolderWriteNothing) {
  BKPlan lost = saved("lost");
  lost.bkPath("");
  EXPECT_EQ(refusal(lost, lost.exec(1)), number::noPath);
  lost.bkPath(path() + "\\missing\\deeper");
  EXPECT_EQ(refusal(lost, lost.exec(1)), number::noPath) << "one level is made, not two";
  EXPECT_EQ(runs(), "1|1|2024-03-07 10:30:00|0|-");
  EXPECT_EQ(tables_.text("select count(*) from syslog"), "0");
}

TEST_F(BackupPlans, RemoveOnlyTheirOwnOldBackups) {
  clock_.set(realTime());
  BKPlan nightly = saved("nightly");
  saved("other");
  nightly.delFiles(true);
  nightly.delNum(2);
  const fs::path old = oldBackup("1");
  const fs::path third = oldBackup("2", {"sys.bak", "app.bak", "notes.txt"});
  const fs::path others = oldBackup("3");
  const fs::path renamed = oldBackup("4", {"sys.bak", "App.bak"});
  const fs::path unknown = oldBackup("5");
  const fs::path half = oldBackup("6", {"app.bak"});
  const fs::path young = oldBackup("7");
  fs::last_write_time(young, fs::file_time_type::clock::now() - std::chrono::hours(47));
  for (const char* stamp : {"1", "2", "4", "6", "7"}) record(1, 10 + std::stoi(stamp), stamp);
  record(2, 13, "3");
  ASSERT_TRUE(nightly.exec(1)) << nightly.errDescription();
  EXPECT_FALSE(fs::exists(old));
  for (const fs::path& kept : {third, others, renamed, unknown, half, young}) EXPECT_TRUE(fs::exists(kept)) << kept;

  nightly.delUnit(7);
  nightly.delNum(0);
  clock_.set(realTime().addDays(1));
  ASSERT_TRUE(nightly.exec(2)) << nightly.errDescription();
  EXPECT_TRUE(fs::exists(young)) << "nothing is old by an unknown unit";
  nightly.delUnit(0);
  clock_.set(realTime().addDays(1).addDays(1.0 / 1440));
  ASSERT_TRUE(nightly.exec(3)) << nightly.errDescription();
  EXPECT_FALSE(fs::exists(young)) << "all before this run is old by no days";
  // Three days old today: what one week takes, and one month.
  nightly.delNum(1);
  Long run = 4;
  for (const auto& [unit, kept, gone] : {std::tuple<Integer, int, int>{1, 3, 5}, {2, 24, 40}}) {
    nightly.delUnit(unit);
    const fs::path folder = oldBackup("1");
    clock_.set(realTime().addDays(kept));
    ASSERT_TRUE(nightly.exec(run++)) << nightly.errDescription();
    EXPECT_TRUE(fs::exists(folder)) << unit;
    clock_.set(realTime().addDays(gone));
    ASSERT_TRUE(nightly.exec(run++)) << nightly.errDescription();
    EXPECT_FALSE(fs::exists(folder)) << unit;
  }
  EXPECT_EQ(tables_.text("select count(*) from QVTaskSche where taskId=1 and state=1 and schNo<10"), "7")
      << "the history stays";

  // Everything until next month is old.
  nightly.delNum(-1);
  nightly.delUnit(2);
  ASSERT_TRUE(nightly.exec(run)) << nightly.errDescription();
  EXPECT_EQ(platform::foldersIn(path()).size(), 6U) << "the five from above, and the run's own";
}

TEST_F(BackupPlans, RemoveWhatKilledRunsLeftHalfWritten) {
  BKPlan nightly = saved("nightly");
  nightly.delFiles(true);
  nightly.delUnit(7);
  const fs::path killed = oldBackup("20200101000000", {"sys.bak", "app.bak.new", "app.bak.new-journal"});
  const fs::path other = oldBackup("letters", {"app.bak.new"});
  const fs::path written = backups_.path() / "20200101000001";
  fs::create_directory(written);
  platform::NewFile file((written / "sys.bak").string(), platform::NewFile::Writers::one);
  ASSERT_TRUE(nightly.exec(1)) << nightly.errDescription();
  EXPECT_EQ(platform::filesIn(killed.string()), std::vector<String>{"sys.bak"});
  EXPECT_EQ(platform::filesIn(other.string()), std::vector<String>{"app.bak.new"});
  EXPECT_EQ(platform::filesIn(written.string()), std::vector<String>{"sys.bak.new"}) << "somebody is at it";
}

TEST_F(BackupPlans, AreListedByName) {
  BKPlan first = plan("nightly");
  first.delFiles(true);
  ASSERT_TRUE(first.Save());
  saved("weekly");
  tables_.run("update QVBkPlan set delOld=1 where taskId=2");
  auto plans = connected<BKPlans>();
  ASSERT_TRUE(plans.GetAll()) << plans.errDescription();
  EXPECT_EQ(plans.Count(), 2);
  EXPECT_FALSE(plans.Item("nightly")->delFiles()) << "only a stored 1 counts in the list";
  EXPECT_TRUE(plans.Item(2)->delFiles());
  EXPECT_EQ(plans.Item("WEEKLY")->schedule()->StartTime(), *Date::parse("10:30"));
  EXPECT_EQ(plans.Item("nobody"), nullptr);
  EXPECT_EQ(plans.Item(3), nullptr);
  EXPECT_EQ(refusal(plans, plans.GetAll()), number::keyExists) << "the list is not emptied first";
  EXPECT_EQ(plans.errDescription().rfind("Fail to get backup plans.", 0), 0U);

  String where = "D:\\bak";
  const auto added = plans.Add(9, "third", &where);
  EXPECT_EQ(plans.Item("third"), added);
  EXPECT_EQ(added->bkPath(), where);
  EXPECT_EQ(added->Id(), 9);
  plans.Remove("nightly");
  EXPECT_EQ(failureOf([&] { plans.Remove("nightly"); }), number::argument);
  EXPECT_EQ(plans.Count(), 2);
}

}  // namespace
}  // namespace QVSa::test
