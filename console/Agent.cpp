#include <algorithm>
#include <csignal>
#include <ctime>
#include <iostream>
#include <memory>

#include "QVSa/maintenance/BKPlans.h"
#include "QVSa/maintenance/QVAgent.h"
#include "console/Commands.h"
#include "console/Table.h"
#include "console/Waiting.h"

namespace QVSa::console {

namespace {

constexpr Integer backupTask = 2;
constexpr double secondsOfDay = 86'400;

struct Options {
  double look = 60;   // seconds
  double until = -1;  // seconds; none: until a signal
};

Date localTime() {
  const std::time_t now = std::time(nullptr);
  std::tm parts{};
  localtime_r(&now, &parts);
  return Date(parts.tm_year + 1900, parts.tm_mon + 1, parts.tm_mday, parts.tm_hour, parts.tm_min,
              std::min(parts.tm_sec, 59));
}

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

  // Runs all that is due, and gives the moment of the next run, or that of the next look.
  Date work(double look) {
    mendChains();
    for (;;) {
      const Date now = localTime();
      const Date later = now.addDays(look / secondsOfDay);
      Integer type = 0;
      Long task = 0;
      Long run = 0;
      Date due;
      cSchedule schedule;
      console_.connect(schedule);
      const Long found = schedule.getNextSch(from_, type, task, run, due);
      require(found >= 0, schedule);
      if (found == 0 || due > later) return later;
      if (due > now) return due;
      // A task of another type is none of ours, and one that could not be run at all is not tried for ever.
      if (type != backupTask || !runPlan(task, run)) from_ = due.addDays(1 / secondsOfDay);
    }
  }

  Answer summary() const {
    return {"Ended. " + counted(done_, "backup") + " made, " + std::to_string(failed_) + " failed.\n",
            {{"done", done_}, {"failed", failed_}}};
  }

 private:
  // A plan whose run died has no run ahead of it.
  void mendChains() const {
    BKPlans plans;
    console_.connect(plans);
    require(plans.GetAll(), plans);
    for (const auto& plan : plans) plan->newSche();
  }

  bool runPlan(Long task, Long run) {
    BKPlan plan;
    console_.connect(plan);
    if (!plan.GetOne(1, std::to_string(task))) return false;
    bool done = false;
    {
      const Waiting waiting(localTime().text() + " " + plan.Name() + ", run " + std::to_string(run));
      done = plan.exec(run);
    }
    ++(done ? done_ : failed_);
    if (!done) std::cerr << plan.errDescription() << "\n";
    return done;
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
    double wait = secondsBetween(localTime(), agent.work(options.look));
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
