#include "QVSa/QVSa.h"
#include "QVSa/frame/DeploymentSecrets.h"
#include "platform/SecretMessage.h"
#include "tests/faults/Shapes.h"
#include "tests/support/PlainSession.h"
#include "tests/support/TestInstallation.h"

namespace QVSa::test {

namespace {

// Each run of a test writes the same file.
String logFile() {
  static const TestFolder folder;
  return (folder.path() / "log.txt").string();
}

bool queryLog(LogRecords& log) {
  std::vector<Variant> values{Date::empty(), Date::empty(), "", "ann", "", ""};
  return log.GetLogByQuery(values, 1);
}

std::vector<Operation> logOperations() {
  const String recording = LoadResString(1701) + " ";
  const Conduct adding{{{"insert into syslog", recording}, {"", recording + LoadResString(1503)}}};
  return {
      on<LogRecords>("LogRecords.Add", adding, [](auto& log) { return log.Add(1, 1, "f", "d"); }),
      on<LogRecords>("LogRecords.GetAll", told(1702),
                     [](auto& log) { return log.GetAll(1, Date::empty(), Date::empty(), 0, "", "", "", 0, 2); }),
      on<LogRecords>("LogRecords.GetLogByQuery", told(1702), queryLog),
      on<LogRecords>("LogRecords.saveLog", told(1704), [](auto& log) { return log.saveLog(logFile()); }),
      on<LogRecords>("LogRecords.clearLog", told(1703), [](auto& log) { return log.clearLog(); }),
  };
}

void newNode(Directory& node) {
  node.Class("D");
  node.superClass("B");
}

void moveNode(Directory& node) {
  require(node.GetOne(1, "B"));
  node.Class("Moved");
  node.superClass("C");
}

std::vector<Operation> classOperations() {
  const auto save = [](Directory& node) { return node.Save(); };
  return {
      on<Directory>("Directory.GetAll", [](auto& node) { return !node.GetAll().empty(); }),
      on<Directory>("Directory.GetOne", [](auto& node) { return node.GetOne(1, "B"); }),
      on<Directory>("Directory.Save of a new node", {}, newNode, save),
      on<Directory>("Directory.Save", atomic(), moveNode, save),
      on<Directory>("Directory.Delete", atomic(), [](auto& node) { return node.Delete("A"); }),
      on<Directory>("Directory.updateSubOrder", [](auto& node) { return node.updateSubOrder("", "C,A"); }),
  };
}

bool readPassword(tmpSafe& safe) {
  String password;
  return safe.getPwd("s1", password);
}

std::vector<Operation> ruleAndSafeOperations() {
  return {
      on<AclRule>("AclRule.GetOne", [](auto& rule) { return rule.GetOne(); }),
      on<AclRule>("AclRule.Save of a new rule", [](auto& rule) { return rule.Save() && rule.Id() == 1; }),
      on<AclRule>(
          "AclRule.Save", {}, [](auto& rule) { rule.Id(1); }, [](auto& rule) { return rule.Save(); }),
      on<tmpSafe>("tmpSafe.connect", [](auto& safe, const String& server) { return safe.connect(server); }),
      on<tmpSafe>("tmpSafe.Save of a first password", [](auto& safe) { return safe.Save(); }),
      on<tmpSafe>("tmpSafe.Save for all", [](auto& safe) { return safe.Save(true); }),
      on<tmpSafe>("tmpSafe.getPwd", readPassword),
  };
}

}  // namespace

void fillLogAndClasses(const String& server) {
  for (const auto& [name, superClass] : {std::pair("A", ""), {"B", "A"}, {"C", ""}, {"E", "B"}}) {
    Directory node;
    node.connect(server, "QVApp");
    node.Class(name);
    node.superClass(superClass);
    require(node.Save());
  }
  LogRecords log;
  log.connect(server, "QVApp");
  require(log.Add(1, 1, "f", "d"));
  PlainSession(server).run("insert into repTmps(rtUid,rtPwd) values('t','" +
                           platform::encryptText(secrets::defaultTemplatePwd, secrets::templatePwdKey) + "')");
}

std::vector<Operation> logAndClassOperations() {
  std::vector<Operation> result = logOperations();
  append(result, classOperations());
  append(result, ruleAndSafeOperations());
  return result;
}

}  // namespace QVSa::test
