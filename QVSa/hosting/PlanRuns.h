#pragma once

#include "QVSa/maintenance/BKPlan.h"

namespace QVSa {

// One run of a backup plan: a row of its chain.
struct PlanRun {
  static constexpr Long pending = 0, done = 1, failed = 2;

  Long planId = 0;
  Long number = 0;  // counted from 1 within the plan
  Date due;         // day 0 where the row has no moment
  Long state = pending;
  String folder;  // of its backup, once it ran
};

// The runs of backup plans: which there are, and running one so that no good copy is lost for a bad one.
//   PlanRuns runs;  runs.connect(server, "QVApp");
//   PlanRun run;  if (!runs.runPlan(plan, run)) complain(runs.errDescription());
class QVSA_EXPORT PlanRuns : private Frame {
 public:
  using Frame::connect;
  using Frame::errDescription;
  using Frame::errNumber;

  // Runs `plan`, loaded before, one run at a time: the pending run numbered `run.number`, or with 0 its next one, which
  // is queued where there is none. `run` comes back as its row then is. As BKPlan::exec, but that old copies go only
  // after a backup that is good and verified, and that a number of the log taken at the same moment by somebody else
  // costs neither run nor entry. 0x80040E31 the plan is running elsewhere; 5 it has run meanwhile, or its path holds a
  // quote; else as exec.
  Boolean runPlan(BKPlan& plan, PlanRun& run);

  // All runs of a plan, by number.
  Boolean GetAll(Long planId);
  // The pending runs of backup plans that are due from `from` on, before `until`, by time.
  Boolean GetDue(Date from, Date until);
  // The pending runs of tasks of any type that are due from `from` on, by time.
  Boolean GetPending(Date from);
  // What the last of these three found.
  const std::vector<PlanRun>& runs() const { return runs_; }

 private:
  PlanRun pendingRun(Connection& connection, BKPlan& plan, Long number);
  PlanRun runOf(Connection& connection, Long planId, Long number);
  Boolean execute(Connection& connection, BKPlan& plan, PlanRun& run);
  Boolean writeLog(const String& folder);
  Boolean list(const String& statement, Date from, Date until = Date());

  std::vector<PlanRun> runs_;
};

}  // namespace QVSa
