#include "tests/faults/HostingOperations.h"

#include "QVSa/QVSa.h"
#include "tests/faults/Shapes.h"

namespace QVSa::test {

namespace {

// A save by `Keeping` of a record that was loaded before.
template <class Keeping, class Record>
Operation keeping(const char* name, std::function<bool(Record&)> load, std::vector<Report> reports = {}) {
  const auto prepare = [load](const String& server) -> std::function<Outcome()> {
    auto record = std::make_shared<Record>();
    record->connect(server, "QVApp");
    require(load(*record));
    return [record, server] {
      Keeping object;
      object.connect(server, "QVApp");
      const bool positive = object.save(*record);
      return Outcome{positive, object.errNumber(), object.errDescription()};
    };
  };
  return {name, prepare, std::move(reports), false};
}

bool loadRule(IdMgr& rule) {
  const bool found = rule.GetOne("unused");
  rule.DateFormat(yymm);
  return found;
}

bool keepHome(HomeKeeping& object, const String&) {
  Home home;
  return object.load(home) && object.save(home);
}

}  // namespace

std::vector<Operation> hostingOperations() {
  const std::vector<Report> signOn{{"select preFix", LoadResString(1503)},
                                   {"select maxId", LoadResString(1503)},
                                   {"insert into idRec", LoadResString(1503)},
                                   {"insert into seslog", LoadResString(1602)}};
  const String notPutBack = "The user is saved, but his groups and the state of his account are not put back: ";
  return {
      operation<SignOn>(
          "SignOn.signOn", nothing<SignOn>,
          [](SignOn& entrance, const String&) { return entrance.signOn("ann", "right"); }, signOn),
      operation<SignOn>(
          "SignOn.signOn of strangers", [](SignOn& entrance) { entrance.refusalTime(1); },
          [](SignOn& entrance, const String&) { return entrance.signOn("ann", "right"); }, signOn),
      operation<LogPages>(
          "LogPages.read", nothing<LogPages>, [](LogPages& log, const String&) { return log.read({}, 1); }, told(1702)),
      operation<HomeKeeping>("HomeKeeping.load and save", nothing<HomeKeeping>, keepHome, {}, true),
      keeping<RuleKeeping, IdMgr>("RuleKeeping.save", loadRule,
                                  {{"select idName", LoadResString(1505)}, {"Update idRule", LoadResString(1505)}}),
      operation<UserKeeping>("UserKeeping.unlock", nothing<UserKeeping>,
                             [](UserKeeping& object, const String&) { return object.unlock(2); }),
      keeping<UserKeeping, User>(
          "UserKeeping.save", [](User& user) { return user.GetOne(3, "ann"); },
          {{"select j.jobId", LoadResString(3101) + " "},
           {"insert into grpUser(userId,gId) select 2,gId from itemGroups where gId in", notPutBack},
           {"update users set pwdDate", notPutBack}}),
      operation<PlanRuns>("PlanRuns.GetDue and GetAll", nothing<PlanRuns>,
                          [](PlanRuns& runs, const String&) {
                            return runs.GetDue(Date(2024, 3, 1), Date(2024, 4, 1)) &&
                                   runs.GetPending(Date(2024, 3, 1)) && runs.GetAll(1);
                          }),
  };
}

std::vector<LetPass> hostingLetPass() {
  std::vector<LetPass> result;
  for (const char* signOn : {"SignOn.signOn", "SignOn.signOn of strangers"}) {
    result.push_back({signOn, "select * from saferule", false, "as User.loginAuth"});
    result.push_back({signOn, "select * from sesLog", false, "as User.loginAuth"});
  }
  return result;
}

}  // namespace QVSa::test
