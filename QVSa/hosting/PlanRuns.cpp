#include "QVSa/hosting/PlanRuns.h"

#include "QVSa/frame/ConnectionString.h"
#include "QVSa/hosting/Collisions.h"
#include "QVSa/hosting/SafeTexts.h"
#include "QVSa/hosting/internal/ApplicationLock.h"
#include "QVSa/resources/Messages.h"
#include "QVSa/syslog/LogRecords.h"
#include "platform/Services.h"

namespace QVSa {

namespace {

constexpr const char* runsOfPlan = "select taskId,schNo,pTime,state,msg from QVTaskSche where taskId=";

PlanRun read(Recordset& row) {
  return {row[0].asLong(), row[1].asLong(), row[2].asDate(), row[3].asLong(), row[4].asText()};
}

ApplicationLock lockOf(const String& server, Long planId) {
  constexpr Long seconds = 1;
  Connection connection;
  connection.Open(buildConnString(server, "", false));
  try {
    return ApplicationLock(std::move(connection), "run of plan " + text(planId), seconds);
  } catch (const Failure& failure) {
    if (failure.number() != number::timeout) throw;
    throw Failure(number::timeout, "PlanRuns", "The backup plan is being run elsewhere.");
  }
}

}  // namespace

Boolean PlanRuns::runPlan(BKPlan& plan, PlanRun& run) {
  return operation(plain(), [&] {
    if (!isPlainPath(plan.bkPath()))
      throw Failure(number::argument, "PlanRuns", "The path of a backup must hold no quote.");
    const ApplicationLock lock = lockOf(server(), plan.Id());
    Connection connection = open();
    run = pendingRun(connection, plan, run.number);
    return execute(connection, plan, run);
  });
}

PlanRun PlanRuns::pendingRun(Connection& connection, BKPlan& plan, Long number) {
  if (number != 0) {
    const PlanRun run = runOf(connection, plan.Id(), number);
    if (run.number == 0 || run.state != PlanRun::pending)
      throw Failure(number::argument, "PlanRuns", "The run is not pending.");
    return run;
  }
  plan.newSche();
  Recordset row = connection.Execute(runsOfPlan + text(plan.Id()) + " and state=0 order by schNo desc");
  return read(row);
}

PlanRun PlanRuns::runOf(Connection& connection, Long planId, Long number) {
  Recordset row = connection.Execute(runsOfPlan + text(planId) + " and schNo=" + text(number));
  return row.EOF_() ? PlanRun() : read(row);
}

// Cleaning is no part of the run itself: that would go by age alone, also behind a backup that failed.
Boolean PlanRuns::execute(Connection& connection, BKPlan& plan, PlanRun& run) {
  const Date now = platform::services().localTime();
  const Boolean cleans = plan.delFiles();
  plan.delFiles(false);
  const Boolean done = plan.exec(run.number);
  plan.delFiles(cleans);
  run = runOf(connection, run.planId, run.number);
  const Boolean isGood = run.state == PlanRun::done;
  if (isGood && cleans) plan.clean(connection, now, run.folder);
  if (done) return true;
  const Boolean lacksEntryOnly = isGood && isCollision(plan.errNumber(), plan.errDescription());
  return lacksEntryOnly ? writeLog(run.folder) : refuseAs(plan);
}

Boolean PlanRuns::writeLog(const String& folder) {
  constexpr Long administrator = 1;
  LogRecords log;
  log.connect(server(), DBName());
  const Boolean written = repeatCollided(log, [&] {
    return log.Add(administrator, administrationLog, LoadResString(3105), fillMsg(LoadResString(3106), {folder}));
  });
  return written ? Boolean{true} : refuseAs(log);
}

Boolean PlanRuns::GetAll(Long planId) { return list(runsOfPlan + text(planId) + " order by schNo", Date()); }

Boolean PlanRuns::GetDue(Date from, Date until) {
  return list(
      "select b.taskId,b.schNo,b.pTime,b.state,b.msg from tasks a,QVTaskSche b where a.taskId=b.taskId"
      " and a.taskType=2 and b.state=0 and b.pTime>=<from> and b.pTime<<until> order by b.pTime,a.taskId",
      from, until);
}

Boolean PlanRuns::GetPending(Date from) {
  return list("select taskId,schNo,pTime,state,msg from QVTaskSche where state=0 and pTime>=<from> order by pTime",
              from);
}

Boolean PlanRuns::list(const String& statement, Date from, Date until) {
  return operation(plain(), [&] {
    runs_.clear();
    Connection connection = open();
    Recordset row = connection.Execute(sql(statement).date("from", from).date("until", until));
    for (; !row.EOF_(); row.MoveNext()) runs_.push_back(read(row));
    return true;
  });
}

}  // namespace QVSa
