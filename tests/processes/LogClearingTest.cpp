#include <chrono>

#include "tests/processes/Worker.h"
#include "tests/support/Scene.h"

namespace QVSa::test {
namespace {

using std::chrono::steady_clock;

class LogClearing : public Scene {};

TEST_F(LogClearing, ASignOnMeanwhileWaitsAndSucceeds) {
  addUser("ann");
  PlainSession system(server(), "QVSys");
  system.run("insert into syslog(logId,logtype,OpDesc) values('1',1,replicate('x',100))");
  for (int doubling = 0; doubling < 18; ++doubling)
    system.run("insert into syslog(logId,logtype,OpDesc) select logId,1,OpDesc from syslog");

  Worker worker("clear-log", {server()});
  worker.go();
  ASSERT_EQ(worker.line(), "clearing");
  // The first of them meet the deletion, which takes some tenths of a second.
  for (int i = 0; i < 5; ++i) {
    auto ann = connected<User>();
    String session;
    const auto before = steady_clock::now();
    EXPECT_TRUE(ann.loginAuth("ann", "right", &session)) << ann.errDescription();
    EXPECT_NE(session, "");
    EXPECT_LT(steady_clock::now() - before, std::chrono::seconds(5));
  }
  EXPECT_EQ(worker.line(), "cleared");
  EXPECT_EQ(system.text("select count(*) from syslog"), "0");
}

}  // namespace
}  // namespace QVSa::test
