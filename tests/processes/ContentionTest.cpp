#include <algorithm>
#include <chrono>
#include <cstdlib>
#include <future>
#include <random>
#include <set>
#include <thread>

#include "tests/processes/Worker.h"
#include "tests/support/Scene.h"

namespace QVSa::test {
namespace {

class Contention : public Scene {
 protected:
  void addRule(const String& name, Integer style = yyyymmdd) {
    auto rule = connected<IdMgr>();
    rule.idName(name);
    rule.DateFormat(style);
    rule.numPlace(5);
    ASSERT_TRUE(rule.Save()) << rule.errDescription();
  }
  std::vector<Worker> start(int count, const std::string& work, std::vector<std::string> arguments) {
    arguments.insert(arguments.begin(), server());
    std::vector<Worker> workers;
    for (int i = 0; i < count; ++i) workers.emplace_back(work, arguments);
    return workers;
  }
  static void go(std::vector<Worker>& workers) {
    for (Worker& worker : workers) worker.go();
  }
  // Eight processes guess so often at the password of Ann, whom the third wrong one locks: how many of the guesses were
  // answered with more than the lock.
  int guessAtAnn(const String& way, const String& each) {
    addUser("ann");
    savePolicy([](safeRule& rule) {
      rule.lockErr(true);
      rule.errTimes(3);
    });
    auto workers = start(8, "guess", {each, way});
    go(workers);
    int told = 0;
    for (Worker& worker : workers) {
      const Lines lines = worker.lines();
      EXPECT_EQ(lines.size(), 1U) << lines.front();
      told += std::stoi(lines.back().substr(5));
    }
    return told;
  }
  // With QVSA_LONG_TESTS set, the contention is that of a large installation.
  static bool isLong() { return std::getenv("QVSA_LONG_TESTS") != nullptr; }
  // The numbers from 1 on, as a rule without prefix issues them on the day of the scene.
  static std::set<String> numbersUpTo(Long last) {
    std::set<String> result;
    for (Long number = 1; number <= last; ++number)
      result.insert("20240307" + std::to_string(100000 + number).substr(1));
    return result;
  }
};

TEST_F(Contention, AThousandWrongPasswordsFromEightProcessesAreAllCounted) {
  guessAtAnn("User", "125");
  EXPECT_EQ(tables_.text("select lgts,accstate from users where userLogin='ann'"), "1000|1");

  auto ann = connected<User>();
  EXPECT_FALSE(ann.loginAuth("ann", "right"));
  EXPECT_EQ(ann.errDescription(), "The account has been locked.");
  EXPECT_EQ(tables_.text("select lgts,accstate from users where userLogin='ann'"), "0|1");
}

TEST_F(Contention, GuessesThatComeAtOnceAreNotAnsweredBeyondTheLimit) {
  EXPECT_EQ(guessAtAnn("SignOn", isLong() ? "125" : "10"), 2) << "the one that reaches the limit is told of the lock";
}

TEST_F(Contention, ASignOnOfPeopleIsNotRefusedForTheOthersOfTheMoment) {
  std::vector<Worker> workers;
  for (int left = isLong() ? 16 : 6; left > 0; --left) {
    const String login = "user" + std::to_string(left);
    addUser(login);
    workers.push_back(std::move(start(1, "sign-on", {login, isLong() ? "200" : "10"}).front()));
  }
  go(workers);
  for (Worker& worker : workers) EXPECT_EQ(worker.lines(), Lines{"done"});
}

TEST_F(Contention, NoNumberIsIssuedTwiceAndNoneIsLost) {
  for (const char* name : {"inv", "own1", "own2"}) addRule(name);
  auto workers = start(8, "issue", {"inv", "100"});
  auto first = start(1, "issue", {"own1", "150"});
  auto second = start(1, "issue", {"own2", "150"});
  for (auto* group : {&workers, &first, &second}) go(*group);

  std::set<String> issued;
  for (Worker& worker : workers) {
    const Lines lines = worker.lines();
    ASSERT_EQ(lines.size(), 101U) << lines.back();
    for (std::size_t i = 0; i < 100; ++i) EXPECT_TRUE(issued.insert(lines[i]).second) << lines[i] << " twice";
  }
  EXPECT_EQ(issued, numbersUpTo(800));
  for (auto* group : {&first, &second}) {
    Lines lines = group->front().lines();
    EXPECT_EQ(lines.back(), "collisions 0") << "who works on another rule sees nothing of it";
    lines.pop_back();
    EXPECT_EQ(std::set<String>(lines.begin(), lines.end()), numbersUpTo(150));
  }
}

// A save widens the rule's row first, and then the numbers, which the issuers hold one after the other.
TEST_F(Contention, ASaveBesideIssuersWaitsForTheirRowsAndFailsForNothing) {
  addRule("inv");
  EXPECT_EQ(connected<IdMgr>().newId("inv"), "2024030700001");
  auto rule = connected<IdMgr>();
  ASSERT_TRUE(rule.GetOne("inv"));
  rule.numPlace(6);
  auto workers = start(8, "issue", {"inv", "1000000"});
  go(workers);
  for (Worker& worker : workers) EXPECT_NE(worker.line(), "");
  std::chrono::steady_clock::duration longest{0};
  for (int i = 0; i < 100; ++i) {
    const auto before = std::chrono::steady_clock::now();
    EXPECT_TRUE(rule.Save()) << i << ": " << rule.errDescription();
    longest = std::max(longest, std::chrono::steady_clock::now() - before);
  }
  RecordProperty("longestSaveInMilliseconds",
                 static_cast<int>(std::chrono::duration_cast<std::chrono::milliseconds>(longest).count()));
  EXPECT_LT(longest, std::chrono::seconds(10));
  for (Worker& worker : workers) {
    worker.kill();
    for (const String& line : worker.lines()) EXPECT_EQ(line.rfind("20240307", 0), 0U) << line;
  }
}

TEST_F(Contention, KilledProcessesLeaveNoLockAndTakeNoMoreThanTheNumberInTheirHands) {
  constexpr int rounds = 8, each = 4;
  addRule("inv");
  std::mt19937 random(20240307);
  std::uniform_int_distribution<int> moment(0, 30000);
  std::set<String> issued;
  String last;
  for (int round = 0; round < rounds; ++round) {
    auto workers = start(each, "issue", {"inv", "1000000"});
    go(workers);
    for (Worker& worker : workers) {
      const String number = worker.line();
      EXPECT_TRUE(issued.insert(number).second) << number;
    }
    for (Worker& worker : workers) {
      std::this_thread::sleep_for(std::chrono::microseconds(moment(random)));
      worker.kill();
    }
    for (Worker& worker : workers)
      for (const String& number : worker.lines()) EXPECT_TRUE(issued.insert(number).second) << number;
    auto survivor = connected<IdMgr>();
    last = survivor.newId("inv");
    EXPECT_TRUE(issued.insert(last).second) << last << survivor.errDescription();
  }
  ASSERT_EQ(last.size(), 13U) << last;
  EXPECT_EQ(*issued.rbegin(), last);
  EXPECT_EQ(tables_.text("select maxId from idRec where idName='inv'"), last);
  const std::set<String> all = numbersUpTo(std::stoi(last.substr(8)));
  EXPECT_TRUE(std::ranges::includes(all, issued));
  EXPECT_LE(all.size() - issued.size(), static_cast<std::size_t>(rounds * each));
}

TEST_F(Contention, ASignOnWhileTheLogIsClearedWaitsAndSucceeds) {
  addUser("ann");
  const PlainSession system(server(), "QVSys");
  system.run("insert into syslog(logId,logtype,OpDesc) values('1',1,replicate('x',100))");
  for (int doubling = 0; doubling < 18; ++doubling)
    system.run("insert into syslog(logId,logtype,OpDesc) select logId,1,OpDesc from syslog");
  auto clearing = std::async(std::launch::async, [&] {
    LogRecords log;
    log.connect(server(), "QVSys");
    return log.clearLog();
  });
  // One after the other until the rows are gone: the deletion goes in one statement.
  int signedOn = 0;
  do {
    auto ann = connected<User>();
    String session;
    ASSERT_TRUE(ann.loginAuth("ann", "right", &session)) << ann.errDescription();
    ++signedOn;
  } while (clearing.wait_for(std::chrono::seconds(0)) != std::future_status::ready);
  EXPECT_TRUE(clearing.get());
  EXPECT_EQ(system.text("select count(*) from syslog"), "0");
  EXPECT_EQ(system.text("select count(*) from seslog"), std::to_string(signedOn));
}

TEST_F(Contention, AHostMayCallWhileItsStaticsAreDestroyed) {
  addUser("ann");
  auto worker = start(1, "call-last", {});
  go(worker);
  EXPECT_EQ(worker.front().lines(), Lines{"done"});
}

}  // namespace
}  // namespace QVSa::test
