#include <algorithm>
#include <filesystem>
#include <memory>

#include "QVSa/hosting/PlanRuns.h"
#include "QVSa/hosting/SafeTexts.h"
#include "QVSa/maintenance/BKPlans.h"
#include "QVSa/values/Text.h"
#include "console/Commands.h"
#include "console/ServerPath.h"
#include "console/Table.h"
#include "console/Waiting.h"
#include "platform/Services.h"

namespace QVSa::console {

namespace {

struct Options {
  String plan;
  String folder;
  Integer cycle = 0;
  Integer every = 1;
  std::vector<String> weekdays;
  Integer day = 0;
  String at = "02:00";
  Integer repeat = 0;
  Integer unit = 0;
  Integer keep = -1;
  Integer keepUnit = 0;
};

const std::map<String, Integer> cycles{{"days", 0}, {"weeks", 1}, {"months", 2}};
const std::map<String, Integer> units{{"hours", 0}, {"minutes", 1}};
const std::vector<String> weekdayNames{"mon", "tue", "wed", "thu", "fri", "sat", "sun"};

BKPlan load(const Console& console, const String& name) {
  BKPlan plan;
  console.connect(plan);
  require(plan.GetOne(BKPlan::byName, name), plan);
  return plan;
}

String maskOf(const std::vector<String>& weekdays) {
  String mask = "0000000";
  for (const String& day : weekdays) {
    const auto place = std::ranges::find(weekdayNames, lowerCase(day));
    if (place == weekdayNames.end()) throw Misuse("There is no weekday " + day + ".");
    mask[static_cast<std::size_t>(place - weekdayNames.begin())] = '1';
  }
  return mask;
}

Date timeOf(const String& text) {
  const auto time = Date::parse(text);
  if (!time || time->days() >= 1) throw Misuse(text + " is no time of day.");
  return *time;
}

void requireWithinADay(const Options& options) {
  constexpr int minutesOfDay = 24 * 60;
  const int minutes = options.repeat * (options.unit == units.at("hours") ? 60 : 1);
  if (minutes >= minutesOfDay) throw Misuse("A plan repeats within a day: every 23 hours is the most.");
}

String keptFor(BKPlan& plan) {
  if (!plan.delFiles()) return "for ever";
  for (const auto& [name, unit] : cycles)
    if (unit == plan.delUnit()) return std::to_string(plan.delNum()) + " " + name;
  return "for ever";
}

// The next moment of each plan that has one; a run that was missed stays pending for ever.
std::map<Long, Date> nextMoments(const Console& console) {
  PlanRuns pending;
  console.connect(pending);
  require(pending.GetPending(platform::services().localTime()), pending);
  std::map<Long, Date> moments;
  for (const PlanRun& run : pending.runs()) moments.emplace(run.planId, run.due);
  return moments;
}

Json nextOf(const std::map<Long, Date>& moments, const BKPlan& plan) {
  const auto moment = moments.find(plan.Id());
  return moment == moments.end() ? Json() : Json(moment->second.text());
}

Answer show(const Console& console, const String& name) {
  BKPlan plan = load(console, name);
  Sheet sheet;
  sheet.line("Plan", "plan", plan.Name()).line("Number", "id", plan.Id()).line("Folder", "folder", plan.bkPath());
  sheet.line("When", "schedule", replaceAll(plan.schedule()->description(), "\r\n", ", "));
  sheet.line("Backups kept", "kept", keptFor(plan)).line("Next run", "next", nextOf(nextMoments(console), plan));
  return {sheet.text(), sheet.document()};
}

bool isSameFolder(const String& a, const String& b) {
  const auto pathOf = [](const String& text) { return std::filesystem::path(replaceAll(text, "\\", "/") + "/"); };
  std::error_code ignored;
  return std::filesystem::equivalent(pathOf(a), pathOf(b), ignored) ||
         pathOf(a).lexically_normal() == pathOf(b).lexically_normal();
}

// A run's folder is named by the second: two plans that are due at the same time would write into one.
void requireOwnFolder(const Console& console, const String& folder) {
  BKPlans plans;
  console.connect(plans);
  require(plans.GetAll(), plans);
  for (const auto& plan : plans)
    if (isSameFolder(plan->bkPath(), folder))
      throw Refusal("The plan " + plan->Name() + " has this folder: each plan needs one of its own.");
}

Answer add(const Console& console, const Options& options) {
  requireWithinADay(options);
  if (!isPlainPath(options.folder)) throw Misuse("The folder of a plan must hold no quote.");
  BKPlan plan;
  console.connect(plan);
  plan.Name(options.plan);
  plan.bkPath(serverPath(console, options.folder));
  cSchedule& when = *plan.schedule();
  when.cycle(options.cycle);
  when.cycleNum(options.every);
  when.wks(maskOf(options.weekdays));
  when.monthDay(options.day);
  when.timesOneDay(options.repeat == 0 ? 1 : 0);
  when.StartTime(timeOf(options.at));
  when.interval(options.repeat);
  when.valUnit(options.unit);
  plan.delFiles(options.keep >= 0);
  plan.delNum(std::max<Integer>(options.keep, 0));
  plan.delUnit(options.keepUnit);
  // A save takes any schedule, also one that would never be due.
  when.GetNextTime(platform::services().localTime());
  require(when.errNumber() == 0, when);
  requireOwnFolder(console, plan.bkPath());
  require(plan.Save(), plan);
  Answer answer = show(console, options.plan);
  answer.text = "The plan is added. `qvsa agent run` runs it.\n\n" + answer.text;
  return answer;
}

Answer list(const Console& console) {
  BKPlans plans;
  console.connect(plans);
  require(plans.GetAll(), plans);
  Table table({{"Plan", "plan"}, {"Folder", "folder"}, {"When", "schedule"}, {"Next run", "next"}});
  const std::map<Long, Date> moments = nextMoments(console);
  for (const auto& plan : plans)
    table.row({plan->Name(), plan->bkPath(), replaceAll(plan->schedule()->description(), "\r\n", ", "),
               nextOf(moments, *plan)});
  return {table.size() == 0 ? "There are no backup plans.\n" : table.text(), {{"plans", table.document()}}};
}

Answer run(const Console& console, const String& name) {
  BKPlan plan = load(console, name);
  PlanRuns runs;
  console.connect(runs);
  PlanRun run;
  {
    const Waiting waiting("Backing up");
    require(runs.runPlan(plan, run), runs);
  }
  return {"Run " + text(run.number) + " of " + plan.Name() + " is done: " + run.folder + "\n",
          {{"plan", plan.Name()}, {"run", run.number}, {"folder", run.folder}}};
}

Answer remove(const Console& console, const String& name) {
  BKPlan plan = load(console, name);
  require(plan.Delete(), plan);
  return {"The plan " + plan.Name() + " is removed; its folders stay.\n", {{"plan", plan.Name()}, {"removed", true}}};
}

Answer history(const Console& console, const String& name) {
  const BKPlan plan = load(console, name);
  static const std::map<Long, String> states{
      {PlanRun::pending, "pending"}, {PlanRun::done, "done"}, {PlanRun::failed, "failed"}};
  PlanRuns runs;
  console.connect(runs);
  require(runs.GetAll(plan.Id()), runs);
  Table table({{"Run", "run"}, {"Due", "due"}, {"State", "state"}, {"Folder", "folder"}});
  for (const PlanRun& run : runs.runs()) {
    const auto state = states.find(run.state);
    table.row({run.number, run.due == Date() ? "" : run.due.text(),
               state == states.end() ? text(run.state) : state->second, run.folder});
  }
  return {table.text(), {{"plan", plan.Name()}, {"runs", table.document()}}};
}

void addAdding(Console& console, CLI::App* group, const std::shared_ptr<Options>& options) {
  CLI::App* command = group->add_subcommand("add", "Add a plan");
  command->add_option("plan", options->plan)->required();
  command
      ->add_option("folder", options->folder,
                   "The folder under which each run makes its own; it has to exist and be no other plan's")
      ->required();
  command->add_option("--every", options->every, "Every so many days, weeks or months")
      ->check(CLI::PositiveNumber)
      ->capture_default_str();
  command->add_option("--cycle", options->cycle, "days (the default), weeks or months")
      ->transform(CLI::CheckedTransformer(cycles, CLI::ignore_case));
  command->add_option("--weekdays", options->weekdays, "Of a weekly plan, as mon,thu")->delimiter(',');
  command->add_option("--day", options->day, "Of a monthly plan; 0 is the month's last day")
      ->check(CLI::Range(0, 31))
      ->capture_default_str();
  command->add_option("--at", options->at, "The time of day, or the first of a day")->capture_default_str();
  command->add_option("--repeat", options->repeat, "Again after so many hours, until midnight")
      ->check(CLI::NonNegativeNumber);
  command->add_option("--repeat-unit", options->unit, "hours (the default) or minutes")
      ->transform(CLI::CheckedTransformer(units, CLI::ignore_case));
  command->add_option("--keep", options->keep, "Remove this plan's backups that are older")
      ->check(CLI::NonNegativeNumber);
  command->add_option("--keep-unit", options->keepUnit, "days (the default), weeks or months")
      ->transform(CLI::CheckedTransformer(cycles, CLI::ignore_case));
  console.command(command, [&console, options] { return add(console, *options); });
}

using Operation = Answer (*)(const Console&, const String&);

void addNamed(Console& console, CLI::App* group, const std::shared_ptr<Options>& options, const String& name,
              const String& description, Operation operation) {
  CLI::App* command = group->add_subcommand(name, description);
  command->add_option("plan", options->plan)->required();
  console.command(command, [&console, options, operation] { return operation(console, options->plan); });
}

}  // namespace

void addPlans(Console& console) {
  const auto options = std::make_shared<Options>();
  CLI::App* group = console.app().add_subcommand("plan", "Backups on a schedule")->require_subcommand(1);
  addAdding(console, group, options);
  CLI::App* listCommand = group->add_subcommand("list", "All plans");
  console.command(listCommand, [&console] { return list(console); });
  addNamed(console, group, options, "show", "A plan", show);
  addNamed(console, group, options, "run", "Run a plan now, in place of its next run", run);
  addNamed(console, group, options, "remove", "Remove a plan", remove);
  addNamed(console, group, options, "history", "The runs of a plan", history);
}

}  // namespace QVSa::console
