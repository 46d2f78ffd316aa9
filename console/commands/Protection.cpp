#include <memory>
#include <optional>

#include "QVSa/classification/AclRule.h"
#include "QVSa/maintenance/tmpSafe.h"
#include "console/Commands.h"
#include "console/Passwords.h"
#include "console/Table.h"

namespace QVSa::console {

namespace {

// One number of the rule: how it is called, read and set.
struct Setting {
  const char* option;
  const char* key;
  const char* meaning;
  Integer (AclRule::*get)() const;
  void (AclRule::*set)(Integer);
};

constexpr Setting settings[] = {
    {"--rw-type", "readWriteType", "Reading and writing, type", &AclRule::RWType, &AclRule::RWType},
    {"--rw-departments", "readWriteDepartments", "  departments", &AclRule::RWDeptSet, &AclRule::RWDeptSet},
    {"--rw-roles", "readWriteRoles", "  roles", &AclRule::RWRoleSet, &AclRule::RWRoleSet},
    {"--design-type", "designType", "Designing, type", &AclRule::DesignType, &AclRule::DesignType},
    {"--design-departments", "designDepartments", "  departments", &AclRule::DesignDeptSet, &AclRule::DesignDeptSet},
    {"--design-roles", "designRoles", "  roles", &AclRule::DesignRoleSet, &AclRule::DesignRoleSet},
    {"--exclude-admin", "excludeAdmin", "Administrators excepted", &AclRule::ExcludeAdmin, &AclRule::ExcludeAdmin}};

using Numbers = std::array<std::optional<Integer>, std::size(settings)>;

AclRule load(const Console& console) {
  AclRule rule;
  console.connect(rule);
  require(rule.GetOne(), rule);
  return rule;
}

Answer show(const Console& console) {
  const AclRule rule = load(console);
  if (rule.Id() == 0) return {"There is no access rule yet.\n", {{"rule", Json()}}};
  Sheet sheet;
  for (const Setting& setting : settings) sheet.line(setting.meaning, setting.key, (rule.*setting.get)());
  return {sheet.text(), {{"rule", sheet.document()}}};
}

Answer set(const Console& console, const Numbers& numbers) {
  AclRule rule = load(console);
  for (std::size_t i = 0; i < numbers.size(); ++i)
    if (numbers[i]) (rule.*settings[i].set)(*numbers[i]);
  require(rule.Save(), rule);
  Answer answer = show(console);
  answer.text = "The access rule is set.\n\n" + answer.text;
  return answer;
}

Answer setTemplatePassword(const Console& console, bool all) {
  tmpSafe safe;
  if (!safe.connect(console.place().server, console.place().database)) throw Refusal(safe.errDesc(), safe.errNumber());
  safe.protectPwd(askNewPassword("New password of the report templates"));
  if (!safe.Save(all)) throw Refusal(safe.errDesc(), safe.errNumber());
  return {String("The password is set.") + (all ? " No template has one of its own any more.\n" : "\n"),
          {{"set", true}, {"all", all}}};
}

}  // namespace

void addProtection(Console& console) {
  CLI::App* group = console.app().add_subcommand("acl", "The access rule for reports")->require_subcommand(1);
  CLI::App* showCommand = group->add_subcommand("show", "The rule as it is");
  console.command(showCommand, [&console] { return show(console); });

  const auto numbers = std::make_shared<Numbers>();
  CLI::App* setCommand = group->add_subcommand("set", "Change the rule; what is not named stays");
  for (std::size_t i = 0; i < numbers->size(); ++i)
    setCommand->add_option(settings[i].option, (*numbers)[i], "A number that the hosts give a meaning");
  console.command(setCommand, [&console, numbers] { return set(console, *numbers); });

  const auto all = std::make_shared<bool>(false);
  CLI::App* passwordCommand =
      console.app().add_subcommand("template-password", "Set the password that protects report templates");
  passwordCommand->add_flag("--all", *all, "Every template loses the password of its own");
  console.command(passwordCommand, [&console, all] { return setTemplatePassword(console, *all); });
}

}  // namespace QVSa::console
