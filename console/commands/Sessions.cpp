#include "QVSa/identity/Sessions.h"

#include <ctime>
#include <memory>

#include "console/Commands.h"
#include "console/Table.h"

namespace QVSa::console {

namespace {

struct Options {
  String session;
  int idleMinutes = 0;
};

// Connecting reads the list and succeeds whatever comes of it: the failure number tells.
void load(const Console& console, Sessions& sessions) {
  console.connect(sessions);
  require(sessions.errNumber() == 0, sessions);
}

Date now() {
  const std::time_t seconds = std::time(nullptr);
  std::tm local{};
  localtime_r(&seconds, &local);
  return Date(local.tm_year + 1900, local.tm_mon + 1, local.tm_mday, local.tm_hour, local.tm_min, local.tm_sec);
}

Answer list(const Console& console) {
  Sessions sessions;
  load(console, sessions);
  Table table({{"Session", "session"},
               {"Login", "login"},
               {"Computer", "computer"},
               {"Address", "address"},
               {"Database", "database"},
               {"Begun", "begun"},
               {"Last active", "lastActive"}});
  for (const auto& session : sessions)
    table.row({session->SessionId(), session->UserLogin(), session->Computer(), session->ip(), session->DBName(),
               session->BeginTime(), session->LastActTime()});
  const String text = table.size() == 0 ? "Nobody is signed on.\n" : table.text();
  return {text, {{"sessions", table.document()}}};
}

Answer end(const Console& console, const String& id) {
  Sessions sessions;
  load(console, sessions);
  bool known = false;
  for (const auto& session : sessions) known = known || session->SessionId() == id;
  if (!known) throw Refusal("There is no session " + id + ".");
  require(sessions.Terminate(id), sessions);
  return {"Session " + id + " is ended.\n", {{"ended", Json::array({id})}}};
}

// Times are compared with this machine's clock, the server's own being out of reach here.
Answer prune(const Console& console, int idleMinutes) {
  Sessions sessions;
  load(console, sessions);
  constexpr double minutesOfADay = 24 * 60;
  const Date limit = now().addDays(-idleMinutes / minutesOfADay);
  Json ended = Json::array();
  for (const auto& session : sessions) {
    const auto last = Date::parse(session->LastActTime());
    if (!last || *last >= limit) continue;
    require(sessions.Terminate(session->SessionId()), sessions);
    ended.push_back(session->SessionId());
  }
  return {counted(ended.size(), "session") + " ended, " +
              counted(static_cast<std::size_t>(sessions.Count()) - ended.size(), "session") + " left.\n",
          {{"ended", ended}}};
}

}  // namespace

void addSessions(Console& console) {
  const auto options = std::make_shared<Options>();
  CLI::App* group = console.app().add_subcommand("sessions", "List and end sessions")->require_subcommand(1);

  CLI::App* listCommand = group->add_subcommand("list", "Who is signed on");
  console.command(listCommand, [&console] { return list(console); });

  CLI::App* endCommand = group->add_subcommand("end", "End a session; the numbers that it still holds become free");
  endCommand->add_option("session", options->session)->required();
  console.command(endCommand, [&console, options] { return end(console, options->session); });

  CLI::App* pruneCommand = group->add_subcommand("prune", "End the sessions without activity, by this machine's clock");
  pruneCommand->add_option("--idle", options->idleMinutes, "Minutes without activity")
      ->required()
      ->check(CLI::PositiveNumber);
  console.command(pruneCommand, [&console, options] { return prune(console, options->idleMinutes); });
}

}  // namespace QVSa::console
