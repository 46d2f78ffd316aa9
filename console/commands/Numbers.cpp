#include <memory>
#include <optional>

#include "QVSa/hosting/Collisions.h"
#include "QVSa/hosting/RuleKeeping.h"
#include "QVSa/numbering/IdMgrs.h"
#include "console/Commands.h"
#include "console/Table.h"

namespace QVSa::console {

namespace {

struct Options {
  String rule;
  String record;
  String session;
  String prefix;
  Integer date = noDate;
  Integer digits = 6;
  Integer reuse = noReuse;
  bool whenSaved = false;
  Long start = 0;
};

// What is not given stays as it is.
struct Changes {
  String rule;
  std::optional<String> prefix;
  std::optional<Integer> date;
  std::optional<Integer> digits;
  std::optional<Integer> reuse;
  bool withNumbers = false;
};

const std::map<String, Integer> dates{{"none", noDate},       {"yymm", yymm}, {"yyyymm", yyyymm}, {"yymmdd", yymmdd},
                                      {"yyyymmdd", yyyymmdd}, {"yy", yy},     {"yyyy", yyyy}};
const std::map<String, Integer> reuses{
    {"none", noReuse}, {"same-day", sameDay}, {"same-month", sameMonth}, {"any", anyone}};

String nameOf(const std::map<String, Integer>& names, Integer value) {
  for (const auto& [name, known] : names)
    if (known == value) return name;
  return std::to_string(value);
}

IdMgr load(const Console& console, const String& name) {
  IdMgr rule;
  console.connect(rule);
  require(rule.GetOne(name), rule);
  return rule;
}

Answer issue(const Console& console, const Options& options) {
  IdMgr rule;
  console.connect(rule);
  const String number =
      repeatCollided(rule, [&] { return rule.newId(options.rule, "", -1, options.record, options.session); });
  require(!number.empty(), rule);
  return {number + "\n", {{"rule", options.rule}, {"number", number}}};
}

Answer list(const Console& console) {
  IdMgrs rules;
  console.connect(rules);
  require(rules.GetAll(), rules);
  Table table({{"Rule", "rule"},
               {"Prefix", "prefix"},
               {"Date part", "date"},
               {"Digits", "digits"},
               {"Reuse", "reuse"},
               {"Like", "sample"}});
  for (const auto& rule : rules)
    table.row({rule->idName(), rule->preFix(), nameOf(dates, rule->DateFormat()), rule->numPlace(),
               nameOf(reuses, rule->reuseStyle()), rule->GetSample()});
  const String text = table.size() == 0 ? "There are no rules but those of the system.\n" : table.text();
  return {text, {{"rules", table.document()}}};
}

Answer show(const Console& console, const String& name) {
  const IdMgr rule = load(console, name);
  Sheet sheet;
  sheet.line("Rule", "rule", rule.idName()).line("Prefix", "prefix", rule.preFix());
  sheet.line("Date part", "date", nameOf(dates, rule.DateFormat())).line("Digits", "digits", rule.numPlace());
  sheet.line("Reuse", "reuse", nameOf(reuses, rule.reuseStyle()));
  sheet.line("Given at saving time", "whenSaved", rule.whenSave()).line("Like", "sample", rule.GetSample());
  return {sheet.text(), sheet.document()};
}

Answer add(const Console& console, const Options& options) {
  IdMgr rule;
  console.connect(rule);
  rule.idName(options.rule);
  rule.preFix(options.prefix);
  rule.DateFormat(options.date);
  rule.numPlace(options.digits);
  rule.reuseStyle(options.reuse);
  rule.whenSave(options.whenSaved);
  require(rule.Save(), rule);
  Answer answer = show(console, options.rule);
  answer.text = "The rule is added.\n\n" + answer.text;
  return answer;
}

// Changes what is named.
Answer set(const Console& console, const Changes& changes) {
  IdMgr rule = load(console, changes.rule);
  if (changes.prefix) rule.preFix(*changes.prefix);
  if (changes.date) rule.DateFormat(*changes.date);
  if (changes.digits) rule.numPlace(*changes.digits);
  if (changes.reuse) rule.reuseStyle(*changes.reuse);
  RuleKeeping keeping;
  console.connect(keeping);
  require(keeping.save(rule, changes.withNumbers), keeping);
  Answer answer = show(console, changes.rule);
  answer.text = "The rule is changed.\n\n" + answer.text;
  return answer;
}

Answer start(const Console& console, const Options& options) {
  IdMgr rule = load(console, options.rule);
  require(repeatCollided(rule, [&] { return rule.setStartNo(options.start); }), rule);
  return {"The next number of " + options.rule + " is " + std::to_string(options.start) + ", in the present period.\n",
          {{"rule", options.rule}, {"next", options.start}}};
}

void addRules(Console& console, CLI::App* number, const std::shared_ptr<Options>& options) {
  CLI::App* group = number->add_subcommand("rule", "The rules of numbers")->require_subcommand(1);

  CLI::App* listCommand = group->add_subcommand("list", "All rules but those of the system");
  console.command(listCommand, [&console] { return list(console); });

  CLI::App* showCommand = group->add_subcommand("show", "A rule");
  showCommand->add_option("rule", options->rule)->required();
  console.command(showCommand, [&console, options] { return show(console, options->rule); });

  CLI::App* addCommand = group->add_subcommand("add", "Add a rule");
  addCommand->add_option("rule", options->rule)->required();
  addCommand->add_option("--prefix", options->prefix);
  addCommand->add_option("--date", options->date, "The date part, and with it the period of the sequence")
      ->transform(CLI::CheckedTransformer(dates, CLI::ignore_case));
  addCommand->add_option("--digits", options->digits, "Digits of the sequence")
      ->check(CLI::Range(1, 14))
      ->capture_default_str();
  addCommand->add_option("--reuse", options->reuse, "Which released numbers may come again")
      ->transform(CLI::CheckedTransformer(reuses, CLI::ignore_case));
  addCommand->add_flag("--when-saved", options->whenSaved, "For the hosts: give the number at saving time");
  console.command(addCommand, [&console, options] { return add(console, *options); });

  const auto changes = std::make_shared<Changes>();
  CLI::App* setCommand = group->add_subcommand("set", "Change a rule; what is not named stays");
  setCommand->add_option("rule", changes->rule)->required();
  setCommand->add_option("--prefix", changes->prefix);
  setCommand->add_option("--date", changes->date, "The date part, and with it the period of the sequence")
      ->transform(CLI::CheckedTransformer(dates, CLI::ignore_case));
  setCommand->add_option("--digits", changes->digits, "Digits of the sequence; they can only grow once numbers exist")
      ->check(CLI::Range(1, 14));
  setCommand->add_option("--reuse", changes->reuse, "Which released numbers may come again")
      ->transform(CLI::CheckedTransformer(reuses, CLI::ignore_case));
  setCommand->add_flag("--with-numbers", changes->withNumbers,
                       "Change the date part though the present period has numbers: some may come twice");
  console.command(setCommand, [&console, changes] { return set(console, *changes); });
}

}  // namespace

void addNumbers(Console& console) {
  const auto options = std::make_shared<Options>();
  CLI::App* group = console.app().add_subcommand("number", "Issue numbers and keep their rules")->require_subcommand(1);

  CLI::App* issueCommand = group->add_subcommand("issue", "The next number of a rule");
  issueCommand->add_option("rule", options->rule)->required();
  issueCommand->add_option("--record", options->record, "Id of the record that holds the number; needed for reuse");
  issueCommand->add_option("--session", options->session, "Session whose end releases the number");
  console.command(issueCommand, [&console, options] { return issue(console, *options); });

  CLI::App* startCommand = group->add_subcommand("start", "Set the next number of the present period");
  startCommand->add_option("rule", options->rule)->required();
  startCommand->add_option("number", options->start)->required()->check(CLI::PositiveNumber);
  console.command(startCommand, [&console, options] { return start(console, *options); });

  addRules(console, group, options);
}

}  // namespace QVSa::console
