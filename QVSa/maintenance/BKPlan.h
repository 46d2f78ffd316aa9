#pragma once

#include <memory>

#include "QVSa/frame/Frame.h"
#include "QVSa/maintenance/cSchedule.h"

namespace QVSa {

// A backup plan: at each due moment both databases go into a new folder under the plan's path. Each due moment is a row
// of the plan; saving queues the first, each run queues the next one.
//   BKPlan plan;  plan.connect(server, "QVApp");  plan.Name("nightly");  plan.bkPath("D:\\bak");
//   plan.schedule()->timesOneDay(1);  plan.Save();
class QVSA_EXPORT BKPlan : private Frame {
 public:
  using Frame::connect;
  using Frame::errDescription;
  using Frame::errNumber;

  // What GetOne finds a plan by.
  enum Key : Integer { byId = 1, byName = 2 };

  // Unique among all tasks.
  String Name() const { return Name_; }
  void Name(String value) { Name_ = std::move(value); }
  // 0 for a plan not yet saved.
  Long Id() const { return Id_; }
  // A folder that exists, as the database server sees it. It goes into the statements of a backup as it is and must
  // hold no quote.
  String bkPath() const { return bkPath_; }
  void bkPath(String value) { bkPath_ = std::move(value); }
  // Made at its first use.
  std::shared_ptr<cSchedule> schedule();
  void schedule(std::shared_ptr<cSchedule> value) { schedule_ = std::move(value); }
  // Whether a run removes backups of this plan that are older than delNum units.
  Boolean delFiles() const { return delFiles_; }
  void delFiles(Boolean value) { delFiles_ = value; }
  Integer delNum() const { return delNum_; }
  void delNum(Integer value) { delNum_ = value; }
  // 0 days, 1 weeks, 2 months; with any other nothing is old.
  Integer delUnit() const { return delUnit_; }
  void delUnit(Integer value) { delUnit_ = value; }

  // Loads a plan by a Key; any other `keyName` loads the first of all. planUnknown (0x80040C1C): no plan.
  Boolean GetOne(Integer keyName = 0, const String& keyValue = "");
  // Inserts a plan without an Id, else updates it. Pending runs are replaced by the next one from now, finished ones
  // stay. 0x80040E2F the name is taken. A new plan has its Id from a save that succeeded. A schedule that can't be
  // computed is saved as far as it goes: True, with the schedule's failure in the error values.
  Boolean Save();
  // Queues the next run where none is pending in the future: for a plan whose chain of runs was broken. Throws Failure.
  void newSche();
  // Removes the plan `Id` (0: this one) with all its runs; its folders stay.
  Boolean Delete(Long Id = 0);
  // Runs the due row `schNo`: makes the backup, records it, queues the next run, removes old backups and what killed
  // runs left half written, and writes the log. False with the backup's number where that failed; all the rest is done
  // then, too. Any other failure ends the run where it stands: without a number of the rule "_log" the log alone is
  // missing. 0x80040E2F where somebody else takes such a number at this moment. The folder is made on this machine, by
  // its clock, and named by the second: two plans with one path that run in one second share it.
  Boolean exec(Long schNo);

 private:
  friend class BKPlans;
  friend class PlanRuns;

  // Everything but delFiles, which its readers take differently.
  void read(Recordset& row);
  // A statement on tasks with the plan's values.
  SqlText taskSql(const String& statement, const String& schDesc);
  Boolean insertTask(Connection& connection, const String& schDesc);
  void updateTask(Connection& connection, const String& schDesc);
  void noteFailureOfSchedule();
  void queueNext(Connection& connection, Date serverTime);
  void clean(Connection& connection, Date now, const String& ownFolder);
  Boolean isOwnBackup(Connection& connection, const String& folder);
  void log(Connection& connection, const String& opDesc);

  String Name_;
  Long Id_ = 0;
  String bkPath_;
  std::shared_ptr<cSchedule> schedule_;
  Boolean delFiles_ = false;
  Integer delNum_ = 0;
  Integer delUnit_ = 0;
};

}  // namespace QVSa
