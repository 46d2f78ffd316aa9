#include <chrono>

#include "QVSa/hosting/SignOn.h"
#include "tests/support/RecordingProvider.h"
#include "tests/support/Scene.h"

namespace QVSa::test {
namespace {

using std::chrono::steady_clock;

class Entrance : public Scene {
 protected:
  void SetUp() override {
    addUser("ann");
    addUser("bob", [](User& user) { user.ipList("10.0.0.1"); });
    savePolicy([](safeRule& rule) {
      rule.lockErr(true);
      rule.errTimes(2);
    });
  }
};

TEST_F(Entrance, TellsStrangersOneThingInOneTime) {
  auto strangers = connected<SignOn>();
  strangers.refusalTime(40);
  for (const auto& [login, password, address] : {std::tuple{"nobody", "x", ""},
                                                 {"ann", "wrong", ""},
                                                 {"bob", "wrong", "10.9.9.9"},
                                                 {"ann", "wrong", ""},
                                                 {"ann", "right", ""}}) {
    const auto before = steady_clock::now();
    EXPECT_FALSE(strangers.signOn(login, password, false, address)) << login << password;
    EXPECT_GE(steady_clock::now() - before, std::chrono::milliseconds(40));
    EXPECT_EQ(strangers.errNumber(), messageNumber(1106));
    EXPECT_EQ(strangers.errDescription(), "Invalid password.");
    EXPECT_EQ(strangers.user().Login() + strangers.sessionId(), "");
  }
  EXPECT_EQ(tables_.text("select accstate from users where userLogin='ann'"), "1");
  EXPECT_FALSE(strangers.signOn("bob", "right", false, "10.9.9.9"));
  EXPECT_EQ(strangers.errNumber(), messageNumber(1132)) << "who has the password is told";
  EXPECT_TRUE(strangers.signOn("bob", "right", false, "10.0.0.1")) << strangers.errDescription();
  EXPECT_EQ(strangers.user().Login(), "bob");
  EXPECT_EQ(tables_.text("select sesId from seslog"), strangers.sessionId());
}

TEST_F(Entrance, TakesOneAttemptAtATimeHoweverTheLoginIsSpelled) {
  auto guess = connected<SignOn>(), other = connected<SignOn>();
  other.patience(1);
  bool met = false;
  {
    RecordingProvider meanwhile;
    meanwhile.beforeEach([&](const String& event) {
      if (event.rfind("update u set lgts", 0) != 0) return;
      met = true;
      EXPECT_FALSE(other.signOn("ANN ", "right")) << "the guess before is not counted yet";
      EXPECT_EQ(other.errNumber(), number::timeout);
      EXPECT_TRUE(other.signOn("bob", "right")) << other.errDescription();
    });
    EXPECT_FALSE(guess.signOn("ann", "wrong"));
  }
  EXPECT_TRUE(met);
  EXPECT_TRUE(other.signOn("ANN ", "right")) << other.errDescription();
}

}  // namespace
}  // namespace QVSa::test
