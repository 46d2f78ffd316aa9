#include <memory>

#include "QVSa/identity/User.h"
#include "console/Commands.h"
#include "console/Passwords.h"

namespace QVSa::console {

namespace {

struct Options {
  String login;
  String name;
  String unit;
  String company;
  String email;
  String mobile;
  String telephone;
  String address;
  String zip;
  String remark;
  bool outside = false;
  bool accept = false;
  bool refuse = false;
};

Answer apply(const Console& console, const Options& options) {
  User user;
  console.connect(user);
  user.Login(options.login);
  user.Name(options.name);
  user.company(options.company);
  user.Email(options.email);
  user.MobilePhone(options.mobile);
  user.telePhone(options.telephone);
  user.Address(options.address);
  user.zipcode(options.zip);
  user.isOuter(options.outside);
  user.Pwd(askNewPassword("Password of " + options.login));
  require(user.Reg(options.unit, options.remark), user);
  return {options.login + " has applied and waits for the audit.\n",
          {{"login", options.login}, {"id", user.Id()}, {"state", "waiting for audit"}}};
}

Answer audit(const Console& console, const Options& options) {
  if (options.accept == options.refuse) throw Misuse("Say either --accept or --refuse.");
  User user;
  console.connect(user);
  require(user.GetOne(User::byLogin, options.login), user);
  // The library audits an account in any state: a locked one would be opened, a normal one refused.
  if (user.regState() != accountWaiting) throw Refusal(options.login + " does not wait for an audit.");
  require(user.regAudit(options.accept, options.remark), user);
  const String result = options.accept ? "accepted" : "refused";
  return {options.login + " is " + result + ".\n", {{"login", options.login}, {"result", result}}};
}

}  // namespace

void addRegistration(Console& console) {
  const auto options = std::make_shared<Options>();
  CLI::App* registerCommand =
      console.app().add_subcommand("register", "Apply for an account; the password is asked for");
  registerCommand->add_option("login", options->login)->required();
  registerCommand->add_option("name", options->name)->required();
  registerCommand->add_option("--unit", options->unit,
                              "The department that the applicant names; inside, it is his company too");
  registerCommand->add_option("--company", options->company, "The company of an outside applicant");
  registerCommand->add_flag("--outside", options->outside, "An outside user");
  registerCommand->add_option("--email", options->email);
  registerCommand->add_option("--mobile", options->mobile);
  registerCommand->add_option("--telephone", options->telephone);
  registerCommand->add_option("--address", options->address);
  registerCommand->add_option("--zip", options->zip);
  registerCommand->add_option("--remark", options->remark, "For the auditor");
  console.command(registerCommand, [&console, options] { return apply(console, *options); });

  CLI::App* auditCommand = console.app().add_subcommand("audit", "Accept or refuse an application");
  auditCommand->add_option("login", options->login)->required();
  auditCommand->add_flag("--accept", options->accept);
  auditCommand->add_flag("--refuse", options->refuse);
  auditCommand->add_option("--remark", options->remark, "For the applicant");
  console.command(auditCommand, [&console, options] { return audit(console, *options); });
}

}  // namespace QVSa::console
