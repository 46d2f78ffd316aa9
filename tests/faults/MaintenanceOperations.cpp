#include <optional>

#include "QVSa/QVSa.h"
#include "QVSa/maintenance/internal/BackupLock.h"
#include "tests/faults/Shapes.h"
#include "tests/support/PlainSession.h"
#include "tests/support/TestInstallation.h"
#include "tests/support/TestServer.h"

namespace QVSa::test {

namespace {

void loadPlan(BKPlan& plan) { require(plan.GetOne(2, "nightly")); }

// The plan's backups go into a folder of the test.
void fillPlan(BKPlan& plan) {
  static const TestFolder folder;
  plan.Name("weekly");
  plan.bkPath(folder.path().string());
  plan.schedule()->timesOneDay(1);
}

bool nextRun(cSchedule& schedule) {
  Integer type = 0;
  Long task = 0, run = 0;
  Date due;
  return schedule.getNextSch(Date(2024, 3, 1), type, task, run, due) == 1;
}

std::vector<Operation> planOperations() {
  const String failed = LoadResString(3103) + LoadResString(2906);
  const Long number = messageNumber(2906);
  const Conduct running{{{"use master", failed, false, number, true},
                         {" backup database", failed, false, number, true},
                         {"restore verifyonly", failed, false, number, true},
                         {"select preFix", LoadResString(1503)},
                         {"select maxId", LoadResString(1503)},
                         {"update idRec", LoadResString(1503)}}};
  const auto save = [](BKPlan& plan) { return plan.Save(); };
  return {
      on<BKPlan>("BKPlan.GetOne", [](auto& plan) { return plan.GetOne(2, "nightly"); }),
      on<BKPlan>("BKPlan.Save of a new plan", atomic(told(3115)), fillPlan, save),
      on<BKPlan>("BKPlan.Save", atomic(told(3115)), loadPlan, save),
      on<BKPlan>("BKPlan.Delete", atomic(told(3114)), loadPlan, [](auto& plan) { return plan.Delete(); }),
      on<BKPlan>("BKPlan.exec", running, loadPlan, [](auto& plan) { return plan.exec(1); }),
      on<BKPlans>("BKPlans.GetAll", told(3104), [](auto& plans) { return plans.GetAll(); }),
      on<cSchedule>("cSchedule.getNextSch", nextRun),
  };
}

// Of a class without the usual connect: the operation names its server, and may raise.
template <class Class>
Operation unconnected(const char* name, std::vector<Report> reports, bool (*run)(Class&, const Place&)) {
  const auto prepare = [run](const String& server) -> Call {
    auto object = std::make_shared<Class>();
    auto raised = std::make_shared<std::optional<Failure>>();
    const auto call = [raised, object, run, place = Place(server)] {
      raised->reset();
      try {
        return run(*object, place);
      } catch (const Failure& failure) {
        *raised = failure;
        return false;
      }
    };
    return {call, [=] { return *raised ? (*raised)->number() : object->errNumber(); },
            [=] { return *raised ? (*raised)->description() : object->errDescription(); }};
  };
  return {name, prepare, std::move(reports), false};
}

bool backUpWithALock(DBMgr& manager, const Place& place) {
  return manager.BackUpDB(place.server, place.sys, place.app, "", "lock");
}

bool decrypt(DBMgr& manager, const Place& place) { return manager.decryptTmps(place.server, "lock"); }

bool restoreBoth(DBMgr& manager, const Place& place) {
  return manager.RestoreDB(place.server, place.groundSys, place.groundApp, TestInstallation::administratorPassword);
}

bool mendPlan(BKPlan& plan, const Place& place) {
  plan.connect(place.server, "QVApp");
  if (!plan.GetOne(2, "broken")) return false;
  plan.newSche();
  return true;
}

// By one that goes with the call: it keeps its connection.
bool askAgent(QVAgent&, const Place& place) {
  QVAgent agent;
  agent.connect(place.server);
  if (agent.newFiles() == 1) return true;
  throw Failure(agent.errNumber(), "", agent.errDescription());
}

}  // namespace

std::vector<Operation> maintenanceOperations() {
  std::vector<Operation> result = planOperations();
  const String restoring = LoadResString(2905);
  const std::vector<Report> ofRestore{{"select isnull(release", restoring},
                                      {"delete from sesLog", restoring},
                                      {"update ", restoring},
                                      {.statement = "", .prefix = "", .suffix = ":0"}};
  const std::vector<Report> ofBackup{{"", LoadResString(2906), false, messageNumber(2906)}};
  append(result, {unconnected<DBMgr>("DBMgr.BackUpDB with a lock", ofBackup, backUpWithALock),
                  unconnected<DBMgr>("DBMgr.decryptTmps", {}, decrypt),
                  unconnected<DBMgr>("DBMgr.RestoreDB", ofRestore, restoreBoth),
                  unconnected<BKPlan>("BKPlan.newSche", {}, mendPlan),
                  unconnected<QVAgent>("QVAgent.connect and newFiles", {}, askAgent)});
  return result;
}

std::vector<LetPass> maintenanceLetPass() {
  std::vector<LetPass> result;
  for (const char* statement : {"select isnull(roleSpec)", "select repId from reports", "update roles"})
    result.push_back({"DBMgr.BackUpDB with a lock", statement, false,
                      "a lock that can't be read or set does not hold the backup up"});
  return result;
}

void fillMaintenance(const String& server) {
  const Place place(server);
  for (const char* name : {"nightly", "broken"}) {
    BKPlan plan;
    plan.connect(server, "QVApp");
    fillPlan(plan);
    plan.Name(name);
    require(plan.Save());
  }
  // Reports, so that there is something to lock, and a lock to lift.
  PlainSession(server).run("insert into reports(repId,repName) values(3,'a') update roles set roleSpec=N'" +
                           BackupLock{"3", "lock"}.cipher() + "' where roleId=4 delete from QVTaskSche where taskId=2");
  PlainSession(server, "QVUpdate").run("insert into sysfile(fileName) values('QVSa.dll')");
  if (onServer()) return;  // its backups lie on its own machine
  DBMgr manager;
  require(manager.BackUpDB(server, place.groundSys, place.groundApp));
}

}  // namespace QVSa::test
