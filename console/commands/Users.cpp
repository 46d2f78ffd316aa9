#include <memory>

#include "QVSa/hosting/UserKeeping.h"
#include "console/Commands.h"
#include "console/Lookup.h"
#include "console/Passwords.h"
#include "console/Table.h"

namespace QVSa::console {

namespace {

struct Options {
  String login;
  String name;
  String department;
  String email;
  String mobile;
};

String stateOf(const User& user) {
  switch (user.regState()) {
    case 0:
      return "normal";
    case 1:
      return "locked";
    case 2:
      return "waiting for audit";
    case 3:
      return "refused at audit";
    default:
      return std::to_string(user.regState());
  }
}

String kindOf(const User& user) {
  switch (user.uType()) {
    case adUser:
      return "Windows domain " + user.Domain();
    case autoReg:
      return "self-registered";
    case ldapUser:
      return "directory";
    default:
      return "general";
  }
}

Json rolesOf(const User& user) {
  Json roles = Json::array();
  if (user.isAdministrator()) roles.push_back("Administrators");
  if (user.isDesigner()) roles.push_back("Report Designers");
  if (user.isOwner()) roles.push_back("Report Owners");
  if (user.isDeptadmin()) roles.push_back("Dept Admin");
  if (user.isProcAdmin()) roles.push_back("Process Admin");
  if (user.isNoticeAdmin()) roles.push_back("Notice Admin");
  return roles;
}

String joined(const Json& texts) {
  String result;
  for (const Json& text : texts) result += (result.empty() ? "" : ", ") + text.get<String>();
  return result;
}

Answer show(const Console& console, const String& login) {
  const User user = userOf(console, login);
  const Json roles = rolesOf(user);
  Sheet sheet;
  sheet.line("Login", "login", user.Login()).line("Name", "name", user.Name()).line("Id", "id", user.Id());
  sheet.line("State", "state", stateOf(user)).line("Account", "account", kindOf(user));
  sheet.line("Department", "department", user.deptFullName()).line("Its number", "departmentNumber", user.deptId());
  sheet.line("Organisation", "organisation", user.orgFullName()).line("Built-in", "builtIn", user.builtIn());
  sheet.line("Outside user", "isOuter", user.isOuter()).line("Built-in roles", "builtInRoles", joined(roles));
  sheet.line("Groups", "groups", user.grpName()).line("E-mail", "email", user.Email());
  sheet.line("Mobile", "mobile", user.MobilePhone()).line("Addresses", "addresses", user.ipList());
  Answer answer{sheet.text(), sheet.document()};
  answer.document["builtInRoles"] = roles;
  return answer;
}

Answer add(const Console& console, const Options& options) {
  User user;
  console.connect(user);
  user.setDept(departmentOf(console, options.department));
  user.Login(options.login);
  user.Name(options.name);
  user.Email(options.email);
  user.MobilePhone(options.mobile);
  user.Pwd(askNewPassword("Password of " + options.login));
  require(user.Save(), user);
  Answer answer = show(console, options.login);
  answer.text = "The user is added.\n\n" + answer.text;
  return answer;
}

Answer unlock(const Console& console, const String& login) {
  const User user = userOf(console, login);
  if (!user.locked()) throw Refusal(login + " is not locked; the state of the account is: " + stateOf(user) + ".");
  UserKeeping keeping;
  console.connect(keeping);
  require(keeping.unlock(user.Id()), keeping);
  return {login + " is unlocked.\n", {{"login", login}, {"unlocked", true}}};
}

}  // namespace

void addUsers(Console& console) {
  const auto options = std::make_shared<Options>();
  CLI::App* group = console.app()
                        .add_subcommand("user", "Show, list, add and unlock users, set their supervisors")
                        ->require_subcommand(1);

  CLI::App* addCommand = group->add_subcommand("add", "Add a user; the password is asked for");
  addCommand->add_option("login", options->login)->required();
  addCommand->add_option("name", options->name)->required();
  addCommand->add_option("--dept", options->department, "Number of the department")->default_val("_root");
  addCommand->add_option("--email", options->email);
  addCommand->add_option("--mobile", options->mobile);
  console.command(addCommand, [&console, options] { return add(console, *options); });

  CLI::App* showCommand = group->add_subcommand("show", "A user");
  showCommand->add_option("login", options->login)->required();
  console.command(showCommand, [&console, options] { return show(console, options->login); });

  CLI::App* unlockCommand = group->add_subcommand("unlock", "Open a locked account; password, groups and jobs stay");
  unlockCommand->add_option("login", options->login)->required();
  console.command(unlockCommand, [&console, options] { return unlock(console, options->login); });
}

}  // namespace QVSa::console
