// The road of a sign-on through the public classes, each step with what the library returned.
//   sign_on_road SERVER LOGIN
// SERVER is the server text of an installation ("file:FOLDER" for an embedded one), LOGIN a user of it without jobs,
// whose password the program sets. Ends with 1 where a step did not turn out as it should.

#include <cstdio>
#include <ctime>

#include "QVSa/identity/Sessions.h"
#include "QVSa/identity/User.h"
#include "QVSa/identity/safeRule.h"
#include "QVSa/numbering/IdMgr.h"
#include "QVSa/organisation/Department.h"
#include "Steps.h"

namespace {

using QVSa::Boolean;
using QVSa::String;

String quoted(const String& text) { return "\"" + text + "\""; }

class Road : private Steps {
 public:
  Road(String server, String login) : Steps(std::move(server)), login_(std::move(login)) {
    password_ = "Road-2-" + std::to_string(std::time(nullptr));
  }

  int walk() {
    endEarlierSessions();
    setPolicy();
    setPassword();
    lock();
    unlock();
    const String first = signOn("desk-1");
    refuseSecondComputer();
    markActivity(first);
    const String number = issueFirst(first);
    end(first);
    issueAgain(number);
    renameDepartment();
    return finish("The road was walked to its end.");
  }

 private:
  template <class Object>
  void show(const String& call, Boolean result, Boolean expected, const Object& object) {
    String returned = result ? "True" : "False";
    if (!result && object.errNumber() != 0) {
      char number[16];
      std::snprintf(number, sizeof number, "0x%08X", static_cast<unsigned>(object.errNumber()));
      returned += "  " + String(number) + "  " + object.errDescription();
    }
    line(call, returned, result == expected);
  }

  QVSa::User loaded() {
    auto user = connected<QVSa::User>();
    if (!user.GetOne(QVSa::User::byLogin, login_)) show("User.GetOne(3, " + quoted(login_) + ")", false, true, user);
    return user;
  }

  // Those of an earlier walk would refuse the sign-on from another computer.
  void endEarlierSessions() {
    auto sessions = connected<QVSa::Sessions>();
    for (const auto& session : sessions)
      if (session->UserLogin() == login_) sessions.Terminate(session->SessionId());
  }

  void setPolicy() {
    title("A policy: 8 characters of mixed kinds, valid for 90 days, 3 kept back, locked by 3 failures");
    auto rule = connected<QVSa::safeRule>();
    rule.GetOne();
    rule.minLen(8);
    rule.maxDay(90);
    rule.caseMixed(true);
    rule.numCharMixed(true);
    rule.cycle(3);
    rule.lockErr(true);
    rule.errTimes(3);
    show("safeRule.Save()", rule.Save(), true, rule);
    show("safeRule.checkPwd(\"abc\")", rule.checkPwd("abc"), false, rule);
  }

  void setPassword() {
    title("The administrator gives the user a password");
    QVSa::User user = loaded();
    user.Pwd("abc");
    show("User.Save() with the password abc", user.Save(), false, user);
    user.Pwd(password_);
    show("User.Save() with a good one", user.Save(), true, user);
    line("User.Name, deptFullName", user.Name() + ", " + user.deptFullName(), true);
  }

  void lock() {
    title("Refused by a wrong password, locked after the third");
    auto user = connected<QVSa::User>();
    String session;
    for (int i = 0; i < 3; ++i)
      show("User.loginAuth(" + quoted(login_) + ", \"wrong\")", user.loginAuth(login_, "wrong", &session), false, user);
    show("User.loginAuth with the right password", user.loginAuth(login_, password_, &session), false, user);
    line("User.locked after a load", loaded().locked() ? "True" : "False", loaded().locked());
  }

  void unlock() {
    title("Unlocked by a save");
    QVSa::User user = loaded();
    user.regState(0);
    show("User.Save(True)", user.Save(true), true, user);
  }

  String signOn(const String& computer) {
    title("Signed on");
    auto user = connected<QVSa::User>();
    String session;
    const Boolean done = user.loginAuth(login_, password_, &session, false, "10.0.0.7", computer);
    show("User.loginAuth from " + computer, done, true, user);
    line("the session id", session, !session.empty());
    line("User.validDay", std::to_string(user.validDay()), user.validDay() == 90);
    return session;
  }

  void refuseSecondComputer() {
    title("Not from two computers at once");
    auto user = connected<QVSa::User>();
    String session;
    show("User.loginAuth from desk-2", user.loginAuth(login_, password_, &session, false, "10.0.0.8", "desk-2"), false,
         user);
  }

  void markActivity(const String& session) {
    title("Activity marked");
    auto sessions = connected<QVSa::Sessions>();
    QVSa::Long uid = 0;
    show("Sessions.newAction", sessions.newAction(session, server_, uid, "desk-1", 0), true, sessions);
    sessions.GetAll();
    line("the session's LastActTime", sessions.Item(session)->LastActTime(), true);
  }

  String issueFirst(const String& session) {
    title("A rule that gives released numbers out again, and a number for a record of this session");
    auto rule = connected<QVSa::IdMgr>();
    if (!rule.GetOne("invoice")) {
      rule.idName("invoice");
      rule.preFix("INV-");
      rule.DateFormat(QVSa::yymmdd);
      rule.numPlace(4);
      rule.reuseStyle(QVSa::anyone);
      show("IdMgr.Save() of rule invoice", rule.Save(), true, rule);
    }
    return issue("record 1", session);
  }

  String issue(const String& record, const String& session) {
    auto rule = connected<QVSa::IdMgr>();
    const String number = rule.newId("invoice", "", -1, record, session);
    line("IdMgr.newId(\"invoice\") for " + record, number.empty() ? rule.errDescription() : number, !number.empty());
    return number;
  }

  void end(const String& session) {
    title("The session ends, and gives its number back");
    auto sessions = connected<QVSa::Sessions>();
    show("Sessions.Terminate", sessions.Terminate(session), true, sessions);
    QVSa::Long uid = 0;
    show("Sessions.newAction", sessions.newAction(session, server_, uid, "desk-1", 0), false, sessions);
    line("IdMgr.InvalidNumbers(\"invoice\")", connected<QVSa::IdMgr>().InvalidNumbers("invoice"), true);
  }

  void issueAgain(const String& number) {
    const String session = signOn("desk-2");
    title("The next session gets the same number, and then a new one");
    const String again = issue("record 2", session);
    line("the same as before", again == number ? "True" : "False", again == number);
    const String next = issue("record 3", session);
    line("another one", next != number ? "True" : "False", next != number);
  }

  QVSa::Department department(const String& number) {
    auto result = connected<QVSa::Department>();
    if (!result.GetOne(QVSa::Department::byNumber, number))
      show("Department.GetOne(1, " + quoted(number) + ")", false, true, result);
    return result;
  }

  // The department directly below the root on the way up from the user's.
  QVSa::Department topOf(QVSa::Department from) {
    while (!from.Super().empty() && from.Super() != "_root") from = department(from.Super());
    return from;
  }

  void renameDepartment() {
    title("A department is renamed, and the subtree below it is rewritten");
    const QVSa::Department home = department(loaded().deptId());
    QVSa::Department top = topOf(home);
    line("fullName of " + home.Id(), home.fullName(), true);
    const String name = top.Name() + " (renamed)";
    top.Name(name);
    show("Department.Save() of " + top.Id() + " as " + quoted(name), top.Save(), true, top);
    const QVSa::Department after = department(home.Id());
    line("fullName of " + home.Id(), after.fullName(), after.fullName().rfind(name, 0) == 0);
    line("its path, as before", after.fullId(), after.fullId() == home.fullId());
  }

  String login_;
  String password_;
};

}  // namespace

int main(int argc, char** argv) { return walkAs<Road>("sign_on_road", argc, argv); }
