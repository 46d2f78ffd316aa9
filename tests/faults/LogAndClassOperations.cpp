#include "tests/faults/LogAndClassOperations.h"

#include "QVSa/QVSa.h"
#include "QVSa/frame/DeploymentSecrets.h"
#include "platform/SecretMessage.h"
#include "tests/faults/Shapes.h"
#include "tests/support/PlainSession.h"

namespace QVSa::test {

namespace {

std::vector<Operation> logOperations() {
  const String recording = LoadResString(1701) + " ";
  return {
      operation<LogRecords>("LogRecords.Add", nothing<LogRecords>,
                            [](LogRecords& log, const String&) { return log.Add(1, 1, "f", "d"); },
                            {{"insert into syslog", recording}, {"", recording + LoadResString(1503)}}),
      operation<LogRecords>(
          "LogRecords.GetAll", nothing<LogRecords>,
          [](LogRecords& log, const String&) {
            return log.GetAll(1, Date::empty(), Date::empty(), 0, "", "", "", 0, 2);
          },
          told(1702)),
      operation<LogRecords>(
          "LogRecords.GetLogByQuery", nothing<LogRecords>,
          [](LogRecords& log, const String&) {
            std::vector<Variant> values{Date::empty(), Date::empty(), "", "ann", "", ""};
            return log.GetLogByQuery(values, 1);
          },
          told(1702)),
      operation<LogRecords>(
          "LogRecords.saveLog", nothing<LogRecords>,
          [](LogRecords& log, const String& server) { return log.saveLog(server.substr(5) + "/log.txt"); }, told(1704)),
      operation<LogRecords>(
          "LogRecords.clearLog", nothing<LogRecords>, [](LogRecords& log, const String&) { return log.clearLog(); },
          told(1703)),
  };
}

std::vector<Operation> classOperations() {
  const auto save = [](Directory& node, const String&) { return node.Save(); };
  return {
      operation<Directory>("Directory.GetAll", nothing<Directory>,
                           [](Directory& node, const String&) { return !node.GetAll().empty(); }),
      operation<Directory>("Directory.GetOne", nothing<Directory>,
                           [](Directory& node, const String&) { return node.GetOne(1, "B"); }),
      operation<Directory>(
          "Directory.Save of a new node",
          [](Directory& node) {
            node.Class("D");
            node.superClass("B");
          },
          save),
      operation<Directory>(
          "Directory.Save",
          [](Directory& node) {
            require(node.GetOne(1, "B"));
            node.Class("Moved");
            node.superClass("C");
          },
          save, {}, true),
      operation<Directory>(
          "Directory.Delete", nothing<Directory>, [](Directory& node, const String&) { return node.Delete("A"); }, {},
          true),
      operation<Directory>("Directory.updateSubOrder", nothing<Directory>,
                           [](Directory& node, const String&) { return node.updateSubOrder("", "C,A"); }),
  };
}

std::vector<Operation> ruleAndSafeOperations() {
  return {
      operation<AclRule>("AclRule.GetOne", nothing<AclRule>,
                         [](AclRule& rule, const String&) { return rule.GetOne(); }),
      operation<AclRule>("AclRule.Save of a new rule", nothing<AclRule>,
                         [](AclRule& rule, const String&) { return rule.Save() && rule.Id() == 1; }),
      operation<AclRule>(
          "AclRule.Save", [](AclRule& rule) { rule.Id(1); }, [](AclRule& rule, const String&) { return rule.Save(); }),
      operation<tmpSafe>("tmpSafe.connect", nothing<tmpSafe>,
                         [](tmpSafe& safe, const String& server) { return safe.connect(server); }),
      operation<tmpSafe>("tmpSafe.Save of a first password", nothing<tmpSafe>,
                         [](tmpSafe& safe, const String&) { return safe.Save(); }),
      operation<tmpSafe>("tmpSafe.Save for all", nothing<tmpSafe>,
                         [](tmpSafe& safe, const String&) { return safe.Save(true); }),
      operation<tmpSafe>("tmpSafe.getPwd", nothing<tmpSafe>,
                         [](tmpSafe& safe, const String&) {
                           String password;
                           return safe.getPwd("s1", password);
                         }),
  };
}

}  // namespace

void fillLogAndClasses(const String& server) {
  const auto addClass = [&](const String& name, const String& superClass) {
    Directory node;
    node.connect(server, "QVApp");
    node.Class(name);
    node.superClass(superClass);
    require(node.Save());
  };
  addClass("A", "");
  addClass("B", "A");
  addClass("C", "");
  addClass("E", "B");
  LogRecords log;
  log.connect(server, "QVApp");
  require(log.Add(1, 1, "f", "d"));
  PlainSession(server).run("insert into repTmps(rtUid,rtPwd) values('t','" +
                           platform::encryptText(secrets::defaultTemplatePwd, secrets::templatePwdKey) + "')");
}

std::vector<Operation> logAndClassOperations() {
  std::vector<Operation> result;
  for (auto part : {logOperations(), classOperations(), ruleAndSafeOperations()})
    result.insert(result.end(), part.begin(), part.end());
  return result;
}

}  // namespace QVSa::test
