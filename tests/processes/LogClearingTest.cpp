#include <algorithm>
#include <chrono>

#include "tests/processes/Worker.h"
#include "tests/support/Scene.h"

namespace QVSa::test {
namespace {

using std::chrono::steady_clock;

class LogClearing : public Scene {
 protected:
  // How long a sign-on takes.
  std::chrono::milliseconds signOn() {
    auto ann = connected<User>();
    String session;
    const auto before = steady_clock::now();
    EXPECT_TRUE(ann.loginAuth("ann", "right", &session)) << ann.errDescription();
    EXPECT_NE(session, "");
    return std::chrono::duration_cast<std::chrono::milliseconds>(steady_clock::now() - before);
  }
  bool isLogEmpty() const { return system_.rows("select top 1 logId from syslog").empty(); }

  PlainSession system_{server(), "QVSys"};
};

TEST_F(LogClearing, ASignOnMeanwhileWaitsAndSucceeds) {
  addUser("ann");
  system_.run("insert into syslog(logId,logtype,OpDesc) values('1',1,replicate('x',100))");
  for (int doubling = 0; doubling < 20; ++doubling)
    system_.run("insert into syslog(logId,logtype,OpDesc) select logId,1,OpDesc from syslog");
  const auto alone = signOn();

  Worker worker("clear-log", {server()});
  worker.go();
  ASSERT_EQ(worker.line(), "clearing");
  // One after the other until the rows are gone: the last of these met the deletion, which goes in one statement.
  std::chrono::milliseconds longest{0};
  for (int i = 0; i < 1000 && !isLogEmpty(); ++i) longest = std::max(longest, signOn());
  EXPECT_EQ(worker.line(), "cleared");
  RecordProperty("millisecondsAlone", static_cast<int>(alone.count()));
  RecordProperty("longestWaitInMilliseconds", static_cast<int>(longest.count()));
  EXPECT_GT(longest, 2 * alone) << "none waited";
  EXPECT_LT(longest, std::chrono::seconds(5));
}

}  // namespace
}  // namespace QVSa::test
