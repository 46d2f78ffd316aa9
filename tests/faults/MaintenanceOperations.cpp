#include "tests/faults/MaintenanceOperations.h"

#include "QVSa/QVSa.h"
#include "QVSa/maintenance/internal/BackupLock.h"
#include "tests/faults/Shapes.h"
#include "tests/support/PlainSession.h"
#include "tests/support/TestInstallation.h"

namespace QVSa::test {

namespace {

// Where the plan's backups go; each run of a test writes the same folder.
String backupPath() {
  static const TestFolder folder;
  return folder.path().string();
}

String groundCopy(const String& name) { return backupPath() + "/ground-" + name; }

void loadPlan(BKPlan& plan) { require(plan.GetOne(2, "nightly")); }

void fillPlan(BKPlan& plan) {
  plan.Name("weekly");
  plan.bkPath(backupPath());
  plan.schedule()->timesOneDay(1);
}

std::vector<Operation> planOperations() {
  const String failed = LoadResString(3103) + LoadResString(2906);
  const Long number = messageNumber(2906);
  return {
      operation<BKPlan>("BKPlan.GetOne", nothing<BKPlan>,
                        [](BKPlan& plan, const String&) { return plan.GetOne(2, "nightly"); }),
      operation<BKPlan>(
          "BKPlan.Save of a new plan", fillPlan, [](BKPlan& plan, const String&) { return plan.Save(); }, told(3115),
          true),
      operation<BKPlan>(
          "BKPlan.Save", loadPlan, [](BKPlan& plan, const String&) { return plan.Save(); }, told(3115), true),
      operation<BKPlan>(
          "BKPlan.Delete", loadPlan, [](BKPlan& plan, const String&) { return plan.Delete(); }, told(3114), true),
      operation<BKPlan>("BKPlan.exec", loadPlan, [](BKPlan& plan, const String&) { return plan.exec(1); },
                        {{"use master", failed, false, number, true},
                         {" backup database", failed, false, number, true},
                         {"restore verifyonly", failed, false, number, true},
                         {"select preFix", LoadResString(1503)},
                         {"select maxId", LoadResString(1503)},
                         {"update idRec", LoadResString(1503)}}),
      operation<BKPlans>(
          "BKPlans.GetAll", nothing<BKPlans>, [](BKPlans& plans, const String&) { return plans.GetAll(); }, told(3104)),
  };
}

// Of a class without the usual connect: the operation names its server, and may raise.
template <class Class>
Operation unconnected(const char* name, std::function<bool(Class&, const String& server)> run,
                      std::vector<Report> reports) {
  const auto prepare = [run](const String& server) -> std::function<Outcome()> {
    return [run, server] {
      try {
        Class object;
        const bool positive = run(object, server);
        return Outcome{positive, object.errNumber(), object.errDescription()};
      } catch (const Failure& failure) {
        return Outcome{false, failure.number(), failure.description()};
      }
    };
  };
  return {name, prepare, std::move(reports), false};
}

}  // namespace

std::vector<Operation> maintenanceOperations() {
  std::vector<Operation> result = planOperations();
  result.push_back(
      operation<cSchedule>("cSchedule.getNextSch", nothing<cSchedule>, [](cSchedule& schedule, const String&) {
        Integer type = 0;
        Long task = 0;
        Long run = 0;
        Date due;
        return schedule.getNextSch(Date(2024, 3, 1), type, task, run, due) == 1;
      }));
  result.push_back(unconnected<DBMgr>("DBMgr.BackUpDB with a lock",
                                      [](DBMgr& manager, const String& server) {
                                        return manager.BackUpDB(server, backupPath() + "/sys", backupPath() + "/app",
                                                                "", "lock");
                                      },
                                      {{"", LoadResString(2906), false, messageNumber(2906)}}));
  result.push_back(
      unconnected<DBMgr>("DBMgr.decryptTmps",
                         [](DBMgr& manager, const String& server) { return manager.decryptTmps(server, "lock"); }, {}));
  const String restoring = LoadResString(2905);
  result.push_back(unconnected<DBMgr>("DBMgr.RestoreDB",
                                      [](DBMgr& manager, const String& server) {
                                        return manager.RestoreDB(server, groundCopy("sys"), groundCopy("app"),
                                                                 TestInstallation::administratorPassword);
                                      },
                                      {{"select isnull(release", restoring},
                                       {"delete from sesLog", restoring},
                                       {"update ", restoring},
                                       {.statement = "", .prefix = "", .suffix = ":0"}}));
  result.push_back(unconnected<BKPlan>("BKPlan.newSche",
                                       [](BKPlan& plan, const String& server) {
                                         plan.connect(server, "QVApp");
                                         if (!plan.GetOne(2, "broken")) return false;
                                         plan.newSche();
                                         return true;
                                       },
                                       {}));
  result.push_back(unconnected<QVAgent>("QVAgent.connect and newFiles",
                                        [](QVAgent& agent, const String& server) {
                                          agent.connect(server);
                                          return agent.newFiles() == 1;
                                        },
                                        {}));
  return result;
}

std::vector<LetPass> maintenanceLetPass() {
  constexpr const char* noLock = "a lock that can't be read or set does not hold the backup up";
  return {
      {"DBMgr.BackUpDB with a lock", "select isnull(roleSpec)", false, noLock},
      {"DBMgr.BackUpDB with a lock", "select repId from reports", false, noLock},
      {"DBMgr.BackUpDB with a lock", "update roles", false, noLock},
  };
}

void fillMaintenance(const String& server) {
  BKPlan plan;
  plan.connect(server, "QVApp");
  fillPlan(plan);
  plan.Name("nightly");
  require(plan.Save());
  BKPlan broken;
  broken.connect(server, "QVApp");
  fillPlan(broken);
  broken.Name("broken");
  require(broken.Save());
  // Reports, so that there is something to lock, and a lock to lift.
  PlainSession(server).run("insert into reports(repId,repName) values(3,'a') update roles set roleSpec=N'" +
                           BackupLock{"3", "lock"}.cipher() + "' where roleId=4 delete from QVTaskSche where taskId=2");
  PlainSession(server, "QVUpdate").run("insert into sysfile(fileName) values('QVSa.dll')");
  DBMgr manager;
  require(manager.BackUpDB(server, groundCopy("sys"), groundCopy("app")));
}

}  // namespace QVSa::test
