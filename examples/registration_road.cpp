// The road of a person from his application to the account, each step with what the library returned.
//   registration_road SERVER
// SERVER is the server text of an installation ("file:FOLDER" for an embedded one). Settings for mail are made where
// there are none. Ends with 1 where a step did not turn out as it should.

#include <cstdio>
#include <ctime>

#include "QVSa/QVSa.h"
#include "QVSa/frame/Connection.h"
#include "QVSa/frame/ConnectionString.h"

namespace {

using QVSa::Boolean;
using QVSa::String;

const String database = "QVApp";

class Road {
 public:
  explicit Road(String server) : server_(std::move(server)) {
    login_ = "applicant-" + std::to_string(std::time(nullptr));
    password_ = "Road-3-" + std::to_string(std::time(nullptr));
  }

  int walk() {
    prepareMail();
    apply();
    signOn("Refused while the application waits", false);
    audit();
    signOn("Signed on after the audit", true);
    std::printf("\n%s\n", asExpected_ ? "The road was walked to its end." : "NOT EVERY STEP WENT AS IT SHOULD.");
    return asExpected_ ? 0 : 1;
  }

 private:
  void title(const char* text) { std::printf("\n%2d  %s\n", ++step_, text); }

  template <class Object>
  void show(const String& call, Boolean result, Boolean expected, const Object& object) {
    asExpected_ = asExpected_ && result == expected;
    const String reason = result ? "" : "  " + object.errDescription();
    std::printf("      %-50s %s%s%s\n", call.c_str(), result ? "True" : "False", reason.c_str(),
                result == expected ? "" : "   <- unexpected");
  }

  template <class Object>
  Object connected() {
    Object object;
    if (!object.connect(server_, database)) show("connect", false, true, object);
    return object;
  }

  void run(const String& statement) { open().Execute(statement); }
  QVSa::Connection open() {
    QVSa::Connection connection;
    connection.Open(QVSa::buildConnString(server_, database, false));
    return connection;
  }

  void showMails() {
    QVSa::Connection connection = open();
    QVSa::Recordset row = connection.Execute("select emTo,emSubject,emBody from QVMailQ where emId>" +
                                             std::to_string(lastMail_) + " order by emId");
    QVSa::Long found = 0;
    for (; !row.EOF_(); row.MoveNext(), ++found)
      std::printf("      queued for %s: %s\n", row["emTo"].asText().c_str(), row["emSubject"].asText().c_str());
    asExpected_ = asExpected_ && found == 1;
    markMails();
  }
  void markMails() { lastMail_ = open().Execute("select isnull(max(emId),0) from QVMailQ")[0].asLong(); }

  void prepareMail() {
    title("The settings: mail is on, with a letter for those accepted");
    QVSa::Home home;
    // The title, the news page and the pictures come by getImage only, and a save writes them.
    show("Home.getImage", home.getImage(server_, database), true, home);
    show("Home.connect", home.connect(server_, database), true, home);
    home.allowSMTP(true);
    home.allowSendEmail(true);
    if (home.emailSubject().empty()) home.emailSubject("Your application");
    if (home.emailPContent().empty()) home.emailPContent("You may sign on now.");
    show("Home.Save()", home.Save(), true, home);
    run("update users set email='admin@example.org' where userLogin='Admin' and isnull(email,'')=''");
    markMails();
  }

  void apply() {
    title("A person applies, and the administrator gets a mail");
    auto user = connected<QVSa::User>();
    user.Name("Applicant");
    user.Login(login_);
    user.Pwd(password_);
    user.Email("applicant@example.org");
    show("User.Reg(\"Sales\", ...)", user.Reg("Sales", "I begin next week."), true, user);
    showMails();
  }

  void audit() {
    title("The administrator accepts, and the applicant gets a mail");
    auto user = connected<QVSa::User>();
    show("User.GetOne", user.GetOne(QVSa::User::byLogin, login_), true, user);
    show("User.regAudit(True, ...)", user.regAudit(true, "See you next week."), true, user);
    showMails();
  }

  void signOn(const char* what, Boolean expected) {
    title(what);
    auto user = connected<QVSa::User>();
    String session;
    show("User.loginAuth", user.loginAuth(login_, password_, &session), expected, user);
    if (session.empty()) return;
    auto sessions = connected<QVSa::Sessions>();
    show("Sessions.Terminate", sessions.Terminate(session), true, sessions);
  }

  String server_;
  String login_;
  String password_;
  QVSa::Long lastMail_ = 0;
  int step_ = 0;
  bool asExpected_ = true;
};

}  // namespace

int main(int argc, char** argv) {
  if (argc != 2) {
    std::fprintf(stderr, "usage: registration_road SERVER\n");
    return 2;
  }
  try {
    return Road(argv[1]).walk();
  } catch (const std::exception& error) {
    std::fprintf(stderr, "registration_road: %s\n", error.what());
    return 1;
  }
}
