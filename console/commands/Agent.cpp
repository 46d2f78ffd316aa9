#include <algorithm>
#include <csignal>
#include <iostream>
#include <memory>
#include <optional>
#include <set>

#include "QVSa/hosting/PlanRuns.h"
#include "QVSa/maintenance/BKPlans.h"
#include "QVSa/maintenance/QVAgent.h"
#include "console/Commands.h"
#include "console/Table.h"
#include "console/Waiting.h"
#include "platform/Services.h"

namespace QVSa::console {

namespace {

constexpr double secondsOfDay = 86'400;

struct Options {
  double look = 60;   // seconds
  double until = -1;  // seconds; none: until a signal
};

Date localTime() { return platform::services().localTime(); }

double secondsBetween(Date from, Date to) { return (to.days() - from.days()) * secondsOfDay; }

// The signals that end a service. While it lives they wait to be asked for, so that none of them breaks a run off.
class EndSignals {
 public:
  EndSignals() {
    sigemptyset(&signals_);
    sigaddset(&signals_, SIGINT);
    sigaddset(&signals_, SIGTERM);
    pthread_sigmask(SIG_BLOCK, &signals_, &before_);
  }
  ~EndSignals() { pthread_sigmask(SIG_SETMASK, &before_, nullptr); }
  EndSignals(const EndSignals&) = delete;
  EndSignals& operator=(const EndSignals&) = delete;

  // Whether one came within so many seconds.
  bool cameWithin(double seconds) const {
    const double whole = std::max(seconds, 0.0);
    timespec limit{static_cast<std::time_t>(whole), 0};
    limit.tv_nsec = static_cast<long>((whole - static_cast<double>(limit.tv_sec)) * 1e9);
    return sigtimedwait(&signals_, nullptr, &limit) > 0;
  }

 private:
  sigset_t signals_;
  sigset_t before_;
};

// What runs the plans when they are due.
class Agent {
 public:
  explicit Agent(const Console& console) : console_(console), from_(localTime()) {}

  // Runs all that is due, mends what is broken, and gives the moment of the next run, or that of the next look. A
  // failure ends neither the service nor what is due: the server may be back at the next look.
  Date work(double look) {
    const auto later = [&] { return localTime().addDays(look / secondsOfDay); };
    try {
      for (auto due = nextMoment(); due && *due <= localTime(); due = nextMoment()) runAllOf(*due);
      mendChains();
      const auto next = nextMoment();
      return next ? std::min(*next, later()) : later();
    } catch (const std::exception& failure) {
      complain(failure.what());
      return later();
    }
  }

  Answer summary() const {
    return {"Ended. " + counted(done_, "backup") + " made, " + std::to_string(failed_) + " failed.\n",
            {{"done", done_}, {"failed", failed_}}};
  }

 private:
  static void complain(const String& reason) { std::cerr << localTime().text() << " " << reason << "\n"; }

  // Of a task of any type.
  std::optional<Date> nextMoment() const {
    Integer type = 0;
    Long task = 0;
    Long run = 0;
    Date due;
    cSchedule schedule;
    console_.connect(schedule);
    const Long found = schedule.getNextSch(from_, type, task, run, due);
    require(found >= 0, schedule);
    return found == 0 ? std::nullopt : std::optional(due);
  }

  // Several tasks may be due in one second, of which the question for the next one names one alone, and always the same
  // where that stays pending: a task of another type, or a plan that could not be run. Each is tried once.
  void runAllOf(Date due) {
    const Date end = due.addDays(1 / secondsOfDay);
    PlanRuns runs;
    console_.connect(runs);
    require(runs.GetDue(due, end), runs);
    from_ = end;
    for (const PlanRun& run : std::vector<PlanRun>(runs.runs())) runPlan(runs, run);
  }

  // A plan whose run died has no run ahead of it. One that is due still has: by now it may lie in the past.
  void mendChains() const {
    PlanRuns runs;
    console_.connect(runs);
    require(runs.GetPending(from_), runs);
    std::set<Long> pending;
    for (const PlanRun& run : runs.runs()) pending.insert(run.planId);
    BKPlans plans;
    console_.connect(plans);
    require(plans.GetAll(), plans);
    const Date now = localTime();
    for (const auto& plan : plans) {
      // A schedule that can't be computed gives a moment long ago, which would never be run.
      const bool hasNext = plan->schedule()->GetNextTime(now) > now;
      if (hasNext && !pending.contains(plan->Id())) plan->newSche();
    }
  }

  void runPlan(PlanRuns& runs, PlanRun run) {
    BKPlan plan;
    console_.connect(plan);
    bool done = plan.GetOne(BKPlan::byId, std::to_string(run.planId));
    if (!done) {
      complain(plan.errDescription());
    } else {
      const Waiting waiting(localTime().text() + " " + plan.Name() + ", run " + std::to_string(run.number));
      done = runs.runPlan(plan, run);
      if (!done) complain(runs.errDescription());
    }
    ++(done ? done_ : failed_);
  }

  const Console& console_;
  Date from_;  // runs before it were missed or have been tried
  std::size_t done_ = 0;
  std::size_t failed_ = 0;
};

Answer run(const Console& console, const Options& options) {
  const EndSignals signals;
  Agent agent(console);
  const Date end = localTime().addDays(options.until / secondsOfDay);
  for (;;) {
    const Date next = agent.work(options.look);
    double wait = secondsBetween(localTime(), next);
    const double left = secondsBetween(localTime(), end);
    const bool isLast = options.until >= 0 && left <= wait;
    if (isLast) wait = left;
    if (signals.cameWithin(wait) || isLast) return agent.summary();
  }
}

Answer check(const Console& console) {
  QVAgent agent;
  agent.connect(console.place().server);
  const Integer state = agent.newFiles();
  require(state >= 0, agent);
  Sheet sheet;
  sheet.line("Release", "release", agent.release()).line("Build", "build", agent.buildNo());
  sheet.line("Release of the database", "databaseRelease", agent.DBrelease());
  sheet.line("Hidden reports", "hiddenReports", agent.hiddenReps()).line("Update due", "updateDue", state == 1);
  return {sheet.text(), sheet.document()};
}

}  // namespace

void addAgent(Console& console) {
  const auto options = std::make_shared<Options>();
  CLI::App* group = console.app().add_subcommand("agent", "What runs beside the people")->require_subcommand(1);

  CLI::App* checking = group->add_subcommand("check", "The release, and whether the program files here are current");
  console.command(checking, [&console] { return check(console); });

  CLI::App* running = group->add_subcommand("run", "Run the backup plans when they are due, until a signal ends it");
  running->add_option("--look", options->look, "Seconds between two looks for new plans")
      ->check(CLI::PositiveNumber)
      ->capture_default_str();
  running->add_option("--for", options->until, "End after so many seconds")->check(CLI::NonNegativeNumber);
  console.command(running, [&console, options] { return run(console, *options); });
}

}  // namespace QVSa::console
