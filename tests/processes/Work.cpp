#include "tests/processes/Work.h"

#include <csignal>
#include <iostream>
#include <sys/resource.h>
#include <unistd.h>

#include "QVSa/QVSa.h"
#include "QVSa/frame/ConnectionString.h"
#include "tests/support/FakeClock.h"

namespace QVSa::test {

namespace {

using Words = std::vector<std::string>;

void writeLine(const std::string& text) { std::cout << text + '\n' << std::flush; }

std::string failureText(Long errNumber, const String& errDescription) {
  std::ostringstream text;
  text << std::hex << static_cast<std::uint32_t>(errNumber) << ' ' << errDescription;
  return text.str();
}

// Whether the answer to a guess tells more than that the account is locked.
template <class Entrance>
bool tellsMore(Entrance& entrance, bool signedOn) {
  if (!signedOn && entrance.errNumber() == messageNumber(1118)) return false;
  if (signedOn || entrance.errNumber() != messageNumber(1106))
    writeLine(failureText(entrance.errNumber(), entrance.errDescription()));
  return true;
}

void guess(const Words& words) {
  int told = 0;
  for (int left = std::stoi(words.at(1)); left > 0; --left) {
    User user;
    SignOn entrance;
    user.connect(words.at(0), "QVApp");
    entrance.connect(words.at(0), "QVApp");
    const bool more = words.at(2) == "User" ? tellsMore(user, user.loginAuth("ann", "wrong"))
                                            : tellsMore(entrance, entrance.signOn("ann", "wrong"));
    if (more) ++told;
  }
  writeLine("told " + std::to_string(told));
}

void signOn(const Words& words) {
  for (int left = std::stoi(words.at(2)); left > 0; --left) {
    SignOn entrance;
    entrance.connect(words.at(0), "QVApp");
    if (!entrance.signOn(words.at(1), "right") || entrance.sessionId().empty())
      writeLine(failureText(entrance.errNumber(), entrance.errDescription()));
  }
  writeLine("done");
}

void issue(const Words& words) {
  int collisions = 0;
  for (int left = std::stoi(words.at(2)); left > 0;) {
    IdMgr rule;
    rule.connect(words.at(0), "QVApp");
    const String number = rule.newId(words.at(1));
    if (!number.empty()) {
      writeLine(number);
      --left;
    } else if (isCollision(rule.errNumber(), rule.errDescription())) {
      ++collisions;
    } else {
      writeLine(failureText(rule.errNumber(), rule.errDescription()));
      return;
    }
  }
  writeLine("collisions " + std::to_string(collisions));
}

void restore(const Words& words) {
  DBMgr manager;
  const bool done = manager.RestoreDB(words.at(0), words.at(1), words.at(2), words.at(3));
  writeLine(done ? "done" : failureText(manager.errNumber(), manager.errDescription()));
}

void backUp(const Words& words) {
  if (words.size() > 3) {
    const rlim_t most = std::stoul(words.at(3));
    const rlimit limit{most, most};
    ::signal(SIGXFSZ, SIG_IGN);
    ::setrlimit(RLIMIT_FSIZE, &limit);
  }
  DBMgr manager;
  const bool done = manager.BackUpDB(words.at(0), words.at(1), words.at(2));
  writeLine(done ? "done" : failureText(manager.errNumber(), manager.errDescription()));
}

void write(const Words& words) {
  for (int times = 1;; ++times) {
    try {
      Connection connection;
      connection.Open(buildConnString(words.at(0), "QVSys", false));
      connection.BeginTrans();
      connection.Execute("update pair set n=n+1 where id=1");
      connection.Execute("update pair set n=n+1 where id=2");
      connection.CommitTrans();
    } catch (const Failure& failure) {
      writeLine(failureText(failure.number(), failure.description()));
    }
    User ann;
    ann.connect(words.at(0), "QVApp");
    // Two who take a number at one moment collide, backup or not.
    if (!ann.loginAuth("ann", "right") && ann.errNumber() != number::integrity)
      writeLine(failureText(ann.errNumber(), ann.errDescription()));
    if (times == 1) writeLine("writing");
  }
}

// A static of the host's.
struct LastCaller {
  std::string server;

  ~LastCaller() {
    if (server.empty()) return;
    User ann;
    ann.connect(server, "QVApp");
    String session;
    const bool signedOn = ann.loginAuth("ann", "right", &session) && ann.chgPwd("right", "new");
    Sessions sessions;
    sessions.connect(server, "QVApp");
    const bool done = signedOn && sessions.Terminate(session);
    writeLine(done ? "done" : failureText(ann.errNumber(), ann.errDescription() + sessions.errDescription()));
  }
};

void callLast(LastCaller& caller, const Words& words) {
  caller.server = words.at(0);
  User ann;
  ann.connect(words.at(0), "QVApp");
  if (!ann.loginAuth("ann", "right")) writeLine(failureText(ann.errNumber(), ann.errDescription()));
}

}  // namespace

int doWork(const Words& words) {
  // Made before the library was used, and so destroyed after whatever that made.
  static LastCaller lastCaller;
  const FakeClock clock(Date(2024, 3, 7, 10, 0, 0));
  std::cin.get();
  const Words arguments(words.begin() + 1, words.end());
  if (words.at(0) == "sign-on") signOn(arguments);
  if (words.at(0) == "guess") guess(arguments);
  if (words.at(0) == "issue") issue(arguments);
  if (words.at(0) == "restore") restore(arguments);
  if (words.at(0) == "back-up") backUp(arguments);
  if (words.at(0) == "write") write(arguments);
  if (words.at(0) == "call-last") callLast(lastCaller, arguments);
  return 0;
}

}  // namespace QVSa::test
