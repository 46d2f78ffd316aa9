#include <memory>
#include <optional>

#include "QVSa/identity/safeRule.h"
#include "console/Commands.h"
#include "console/Switch.h"
#include "console/Table.h"

namespace QVSa::console {

namespace {

// What is not given stays as it is.
struct Options {
  std::optional<Integer> minLen;
  std::optional<Integer> maxDay;
  std::optional<Integer> cycle;
  std::optional<Integer> errTimes;
  std::optional<bool> caseMixed;
  std::optional<bool> numCharMixed;
  std::optional<bool> hasSpecialChar;
};

safeRule load(const Console& console) {
  safeRule rule;
  console.connect(rule);
  require(rule.GetOne(), rule);
  return rule;
}

Json limited(Integer value) { return value > 0 ? Json(value) : Json(); }

String orNone(const Json& value, const String& none) { return value.is_null() ? none : shown(value); }

Answer show(const Console& console) {
  const safeRule rule = load(console);
  Json document;
  document["minLength"] = limited(rule.minLen());
  document["maxDays"] = limited(rule.maxDay());
  document["history"] = limited(rule.cycle());
  document["lockAfter"] = rule.lockErr() ? Json(rule.errTimes()) : Json();
  document["mixedCase"] = rule.caseMixed();
  document["lettersAndDigits"] = rule.numCharMixed();
  document["otherCharacters"] = rule.hasSpecialChar();
  Sheet sheet;
  sheet.line("Least length of a password", "", orNone(document["minLength"], "none"));
  sheet.line("Capital and small letters", "", document["mixedCase"]);
  sheet.line("Letters and digits", "", document["lettersAndDigits"]);
  sheet.line("Other characters", "", document["otherCharacters"]);
  sheet.line("Days that a password is valid", "", orNone(document["maxDays"], "without limit"));
  sheet.line("Earlier passwords that may not come again", "", orNone(document["history"], "none"));
  sheet.line("Failed sign-ons that lock an account", "", orNone(document["lockAfter"], "never locked"));
  return {sheet.text(), document};
}

Answer set(const Console& console, const Options& options) {
  safeRule rule = load(console);
  if (options.minLen) rule.minLen(*options.minLen);
  if (options.maxDay) rule.maxDay(*options.maxDay);
  if (options.cycle) rule.cycle(*options.cycle);
  if (options.caseMixed) rule.caseMixed(*options.caseMixed);
  if (options.numCharMixed) rule.numCharMixed(*options.numCharMixed);
  if (options.hasSpecialChar) rule.hasSpecialChar(*options.hasSpecialChar);
  if (options.errTimes) {
    rule.errTimes(*options.errTimes);
    rule.lockErr(*options.errTimes > 0);
  }
  require(rule.Save(), rule);
  Answer answer = show(console);
  answer.text = "The policy is set.\n\n" + answer.text;
  if (!rule.lockErr()) answer.text += "\nFailed sign-ons do not lock: every account that was locked is open again.\n";
  return answer;
}

}  // namespace

void addPolicy(Console& console) {
  const auto options = std::make_shared<Options>();
  CLI::App* group = console.app().add_subcommand("policy", "The policy for passwords and locks")->require_subcommand(1);

  CLI::App* showCommand = group->add_subcommand("show", "The policy as it is");
  console.command(showCommand, [&console] { return show(console); });

  CLI::App* setCommand = group->add_subcommand("set", "Change the policy; what is not named stays");
  const auto number = [&](const char* name, std::optional<Integer>& value, const char* meaning) {
    setCommand->add_option(name, value, meaning)->check(CLI::NonNegativeNumber);
  };
  number("--min-length", options->minLen, "Least length of a password; 0: none");
  number("--max-days", options->maxDay, "Days that a password is valid; 0: for ever");
  number("--history", options->cycle, "How many earlier passwords may not come again");
  number("--lock-after", options->errTimes, "Failed sign-ons in a row that lock an account; 0: never");
  addSwitch(setCommand, "mixed-case", options->caseMixed, "Capital and small letters");
  addSwitch(setCommand, "letters-and-digits", options->numCharMixed, "Letters and digits");
  addSwitch(setCommand, "other-characters", options->hasSpecialChar, "Other characters");
  console.command(setCommand, [&console, options] { return set(console, *options); });
}

}  // namespace QVSa::console
