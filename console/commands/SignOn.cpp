#include "QVSa/hosting/SignOn.h"

#include <memory>

#include "QVSa/identity/Sessions.h"
#include "console/Commands.h"
#include "console/Passwords.h"
#include "console/Table.h"

namespace QVSa::console {

namespace {

struct Options {
  String login;
  String computer;
  String address;
};

Answer signOn(const Console& console, const Options& options) {
  SignOn entrance;
  console.connect(entrance);
  const String password = askPassword("Password of " + options.login);
  require(entrance.signOn(options.login, password, false, options.address, options.computer), entrance);
  const String& session = entrance.sessionId();
  // The library lets an expired password in without a session, for its change alone.
  if (session.empty())
    throw Refusal(entrance.errDescription() + " Change it with: qvsa password " + options.login, entrance.errNumber());

  const User& user = entrance.user();
  Sheet sheet;
  sheet.line("Session", "session", session).line("Login", "login", user.Login()).line("Name", "name", user.Name());
  sheet.line("Department", "department", user.deptFullName()).line("Organisation", "organisation", user.orgFullName());
  if (user.validDay() >= 0) sheet.line("Password valid, days", "validDays", user.validDay());
  return {user.Name() + " is signed on.\n\n" + sheet.text(), sheet.document()};
}

// A session that only tested the old password does not stay.
void endSession(const Console& console, const String& session) {
  Sessions sessions;
  console.connect(sessions);
  require(sessions.Terminate(session), sessions);
}

// The old password goes through a sign-on, so that wrong ones are counted and a locked account stays closed.
Answer changePassword(const Console& console, const String& login) {
  SignOn entrance;
  console.connect(entrance);
  const String oldPassword = askPassword("Present password of " + login);
  require(entrance.signOn(login, oldPassword), entrance);
  if (!entrance.sessionId().empty()) endSession(console, entrance.sessionId());
  User& user = entrance.user();
  if (user.PwdNoChange()) throw Refusal(login + " may not change the password.");
  require(user.chgPwd(oldPassword, askNewPassword("New password")), user);
  return {"The password of " + login + " is changed.\n", {{"login", login}, {"changed", true}}};
}

}  // namespace

void addSignOn(Console& console) {
  const auto options = std::make_shared<Options>();
  CLI::App* signOnCommand = console.app().add_subcommand("sign-on", "Sign a user on and show his session");
  signOnCommand->add_option("login", options->login)->required();
  signOnCommand->add_option("--computer", options->computer,
                            "Name of the computer; with it, a session on another computer refuses the sign-on");
  signOnCommand->add_option("--address", options->address, "Addresses of the computer, \"|\" between");
  console.command(signOnCommand, [&console, options] { return signOn(console, *options); });

  CLI::App* password = console.app().add_subcommand("password", "Change a password, also one that has expired");
  password->add_option("login", options->login)->required();
  console.command(password, [&console, options] { return changePassword(console, options->login); });
}

}  // namespace QVSa::console
