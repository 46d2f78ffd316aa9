#include "QVSa/hosting/Logins.h"

#include <memory>

#include "console/Commands.h"
#include "console/Passwords.h"

namespace QVSa::console {

namespace {

struct Options {
  String login;
  String administrator = "sa";
};

Answer setPassword(const Console& console, const Options& options) {
  const String ofAdministrator = askPassword("Password of " + options.administrator);
  const String password = askNewPassword("New password of " + options.login);
  Logins logins;
  console.connect(logins);
  require(logins.setPassword(options.login, password, options.administrator, ofAdministrator), logins);
  Answer answer{"The password of " + options.login + " is changed.\n", {{"login", options.login}}};
  if (options.login == "QVUser")
    answer.text += "Hosts need it in their server text now: `qvsa secrets scramble` gives the part behind the \"|\".\n";
  return answer;
}

}  // namespace

void addLogins(Console& console) {
  const auto options = std::make_shared<Options>();
  CLI::App* login = console.app().add_subcommand("login", "The log-ins of the database server");
  login->require_subcommand(1);
  CLI::App* password =
      login->add_subcommand("password", "Change the password of a log-in; asks for the administrator's");
  password->add_option("login", options->login, "QVUser, which hosts connect as, or sa")->required();
  password->add_option("--as", options->administrator, "The administrator of the database server")
      ->capture_default_str();
  console.command(password, [&console, options] { return setPassword(console, *options); });
}

}  // namespace QVSa::console
