#include "tests/memory/Operations.h"

#include <filesystem>
#include <fstream>
#include <sstream>
#include <unistd.h>

#include "QVSa/QVSa.h"
#include "tests/support/PlainSession.h"
#include "tests/support/TestInstallation.h"

namespace QVSa::test {

namespace {

void require(bool done) {
  if (!done) throw std::logic_error("the ground of the test could not be made");
}

template <class Class>
Call callOf(const std::shared_ptr<Class>& object, std::function<bool()> run, std::function<bool()> isTrue) {
  return {std::move(run), [object] { return object->errNumber(); }, [object] { return object->errDescription(); },
          std::move(isTrue)};
}

bool opens(const String& server, const String& password) {
  User user;
  user.connect(server, "QVApp");
  return user.loginAuth("ann", password);
}

Call signOn(const String& server) {
  const auto user = std::make_shared<User>();
  const auto session = std::make_shared<String>();
  return callOf(
      user,
      [=] {
        return user->connect(server, "QVApp") && user->loginAuth("ann", "right", session.get(), false, "", "pc1") &&
               !session->empty();
      },
      [=] {
        const PlainSession tables(server, "QVSys");
        const bool found = tables.text("select userLogin from seslog where sesId='" + *session + "'") == "ann";
        tables.run("delete from seslog");
        return found;
      });
}

// A sign-on that is refused with the message is a positive result; that the user is in is what must not be so.
Call refusedSignOn(const String& server, const String& login, const String& password, Long message) {
  const auto user = std::make_shared<User>();
  const auto isIn = std::make_shared<bool>(false);
  return callOf(
      user,
      [=] {
        if (!user->connect(server, "QVApp")) return false;
        *isIn = user->loginAuth(login, password);
        return *isIn || user->errNumber() == messageNumber(message);
      },
      [=] { return !*isIn; });
}

Call wrongPassword(const String& server) { return refusedSignOn(server, "ann", "", 1106); }
Call lockedUser(const String& server) { return refusedSignOn(server, "bob", "right", 1118); }

Call changeOfPassword(const String& server) {
  const auto user = std::make_shared<User>();
  const auto now = std::make_shared<String>();
  const auto change = [=](const char* before, const char* after) {
    *now = after;
    return user->chgPwd(before, after);
  };
  auto call = callOf(
      user,
      [=] {
        if (!user->connect(server, "QVApp") || !user->GetOne(3, "ann")) return false;
        return change("right", "other") || (user->errNumber() == messageNumber(1121) && change("other", "right"));
      },
      [=] { return opens(server, *now); });
  call.isWhole = [=] { return !opens(server, "") && (opens(server, "right") || opens(server, "other")); };
  return call;
}

// A text that no other call has. It lies within a string: passing it on asks for no memory.
String unique() {
  static int number = 0;
  return std::to_string(++number) + "." + std::to_string(::getpid());
}

Call savedUser(const String& server) {
  const auto user = std::make_shared<User>();
  const String email = unique();
  auto call = callOf(
      user,
      [=] {
        if (!user->connect(server, "QVApp") || !user->GetOne(3, "ann")) return false;
        user->Email(email);
        user->setJobs("1,2");
        return user->Save();
      },
      [=] {
        const PlainSession tables(server);
        return tables.text("select email from users where userLogin='ann'") == email &&
               tables.text("select count(*) from userJob uj,users u where uj.userId=u.userId and userLogin='ann'") ==
                   "2";
      });
  call.isWhole = [=] { return opens(server, "right") && !opens(server, ""); };
  return call;
}

Call issuedNumber(const String& server) {
  const auto rule = std::make_shared<IdMgr>();
  const auto issued = std::make_shared<String>();
  return callOf(
      rule,
      [=] {
        *issued = rule->connect(server, "QVApp") ? rule->newId("inv", "", -1, "r1", "s1") : "";
        return !issued->empty();
      },
      [=] {
        const PlainSession tables(server);
        return tables.text("select max(maxId) from idRec where idName='inv'") == *issued &&
               tables.text("select count(*) from idDel where idName='inv' and theId='" + *issued + "'") == "1";
      });
}

Call addedLogRow(const String& server) {
  const auto log = std::make_shared<LogRecords>();
  const String text = unique();
  return callOf(
      log, [=] { return log->connect(server, "QVApp") && log->Add(1, 2, "function", text); },
      [=] { return PlainSession(server).text("select count(*) from syslog where opDesc='" + text + "'") == "1"; });
}

String contentOf(const String& path) {
  std::ostringstream content;
  content << std::ifstream(path, std::ios::binary).rdbuf();
  return content.str();
}

const Long logType = 1;
String wholeLog(const String& server) { return server.substr(5) + "/whole.txt"; }

Call savedLog(const String& server) {
  const auto log = std::make_shared<LogRecords>();
  const String path = server.substr(5) + "/log.txt";
  std::filesystem::remove(path);
  auto call = callOf(
      log, [=] { return log->connect(server, "QVApp") && log->saveLog(path, &logType); },
      [=] { return contentOf(path) == contentOf(wholeLog(server)); });
  call.isWhole = [=] { return !std::filesystem::exists(path) || contentOf(path) == contentOf(wholeLog(server)); };
  return call;
}

String groundCopy(const String& server, const char* name) { return server.substr(5) + "/ground." + name; }

Call backup(const String& server) {
  const auto manager = std::make_shared<DBMgr>();
  const String sys = server.substr(5) + "/sys.bak";
  const String app = server.substr(5) + "/app.bak";
  return callOf(
      manager, [=] { return manager->BackUpDB(server, sys, app, "", "lock"); },
      [=] {
        PlainSession(server).run("restore verifyonly from disk='" + sys + "'");
        PlainSession(server).run("restore verifyonly from disk='" + app + "'");
        const bool locked = !manager->decryptTmps(server, "wrong");
        return locked && manager->decryptTmps(server, "lock");
      });
}

// Makes both databases differ from their copies.
void changeAfterCopies(const String& server) {
  for (const char* database : {"QVSys", "QVApp"})
    PlainSession(server, database).run("update idRule set preFix='changed' where idName='_log'");
}

Call restore(const String& server) {
  const auto manager = std::make_shared<DBMgr>();
  const String sys = groundCopy(server, "sys");
  const String app = groundCopy(server, "app");
  const String password = TestInstallation::administratorPassword;
  auto call = callOf(
      manager, [=] { return manager->RestoreDB(server, sys, app, password); },
      [=] {
        const String changed = "select count(*) from idRule where preFix='changed'";
        return PlainSession(server, "QVSys").text(changed) == "0" && PlainSession(server).text(changed) == "0";
      });
  call.isWhole = [=] {
    changeAfterCopies(server);
    return true;
  };
  return call;
}

void addUser(const String& server, const String& login, Integer state) {
  User user;
  user.connect(server, "QVApp");
  user.Name(login + ", whose name asks for memory");
  user.Login(login);
  user.Pwd("right");
  user.regState(state);
  require(user.Save());
}

}  // namespace

void fillMemoryGround(const std::string& server) {
  safeRule policy;
  policy.connect(server, "QVApp");
  policy.minLen(1);
  require(policy.Save());
  addUser(server, "ann", 0);
  addUser(server, "bob", 1);
  IdMgr rule;
  rule.connect(server, "QVApp");
  rule.idName("inv");
  rule.preFix("I");
  rule.DateFormat(yymmdd);
  rule.numPlace(8);
  require(rule.Save());
  LogRecords log;
  log.connect(server, "QVApp");
  for (int i = 0; i < 3; ++i) require(log.Add(1, 1, "function", "a row of the log, é and so on"));
  require(log.saveLog(wholeLog(server), &logType));
  PlainSession(server).run("insert into reports(repId) values(1)");
  require(DBMgr().BackUpDB(server, groundCopy(server, "sys"), groundCopy(server, "app")));
  changeAfterCopies(server);
}

const std::vector<MemoryOperation>& memoryOperations() {
  static const std::vector<MemoryOperation> all{
      {"SignOn", signOn},
      {"WrongPassword", wrongPassword},
      {"LockedUser", lockedUser},
      {"ChgPwd", changeOfPassword},
      {"UserSave", savedUser},
      {"NewId", issuedNumber},
      {"LogRecordsAdd", addedLogRow},
      {"SaveLog", savedLog},
      {"BackUpDB", backup},
      {"RestoreDB", restore},
  };
  return all;
}

}  // namespace QVSa::test
