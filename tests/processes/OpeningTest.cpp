#include <fstream>
#include <sys/stat.h>
#include <unistd.h>

#include "providers/embedded/storage/Handle.h"
#include "providers/embedded/storage/Layout.h"
#include "providers/embedded/storage/Pool.h"
#include "tests/processes/Worker.h"
#include "tests/support/Scene.h"

namespace QVSa::test {
namespace {

class Opening : public Scene {
 protected:
  Opening() {
    addUser("ann");
    embedded::discardIdleHandle(installation_.folder());
  }

  std::filesystem::path file(const char* database) const {
    return embedded::databaseFile(installation_.folder(), database);
  }
  static void expectRefused(const String& server, Long errNumber, const String& reason) {
    User user;
    EXPECT_TRUE(user.connect(server)) << "nothing is opened yet";
    EXPECT_FALSE(user.GetOne(3, "ann"));
    EXPECT_EQ(user.errNumber(), errNumber);
    EXPECT_NE(user.errDescription().find(reason), String::npos) << user.errDescription();
    EXPECT_EQ(user.errDescription().find(defaultDbPwd()), String::npos);
  }
  void expectIntact() { EXPECT_EQ(loaded("ann").Name(), "Ann"); }
};

TEST_F(Opening, AWrongPasswordOfTheConnectionIsToldWithoutIt) {
  expectRefused(server() + "|" + scrambleText("mellow"), number::login, "Login failed for user 'QVUser'.");
  expectRefused(server() + "|never scrambled", number::login, "Login failed for user 'QVUser'.");
  EXPECT_TRUE(User().connect(server() + "|" + scrambleText(defaultDbPwd())));
  expectIntact();
}

TEST_F(Opening, AFolderThatIsNotThereIsNotMade) {
  expectRefused(server() + "/elsewhere", number::general, "SQL Server does not exist or access denied.");
  EXPECT_FALSE(std::filesystem::exists(installation_.folder() / "elsewhere"));
  expectRefused("file:", number::general, "names no folder");
  expectRefused("", number::general, "");
}

TEST_F(Opening, AFileThatIsNoDatabaseIsRefusedAndLeftAsItIs) {
  const auto aside = installation_.folder() / "aside";
  std::filesystem::rename(file("QVSys"), aside);
  std::ofstream(file("QVSys")) << String(9000, 'x');
  expectRefused(server(), number::login, "Cannot open database \"QVSys\": the file is no database");
  EXPECT_EQ(std::filesystem::file_size(file("QVSys")), 9000U);
  std::filesystem::rename(aside, file("QVSys"));
  expectIntact();
}

TEST_F(Opening, ADatabaseOfANewerReleaseIsRefused) {
  const auto setLayout = [&](int layout) {
    embedded::Handle(installation_.folder()).execute("update QVSys.engine set layout=" + std::to_string(layout));
  };
  embedded::Handle open(installation_.folder());
  setLayout(embedded::layoutVersion + 1);
  expectRefused(server(), number::login, "A newer release has to open it.");
  open.execute("update QVSys.engine set layout=" + std::to_string(embedded::layoutVersion));
  expectIntact();
}

TEST_F(Opening, WithoutRightsToWriteNothingIsOpened) {
  if (::geteuid() != 0) GTEST_SKIP() << "takes another user's identity";
  const auto refusedAsNobody = [&] {
    Worker worker("load-as-nobody", {server()});
    worker.go();
    return worker.line();
  };
  const String refused = "80040e4d Cannot open database \"master\": ";
  EXPECT_EQ(refusedAsNobody().rfind(refused + "Permission denied (", 0), 0U);
  std::filesystem::permissions(installation_.folder(), std::filesystem::perms(0755));
  for (const char* name : embedded::databaseNames) ::chmod(file(name).c_str(), 0644);
  EXPECT_EQ(refusedAsNobody().rfind(refused + "the file or its folder is read-only for this user (", 0), 0U);
  expectIntact();
}

TEST_F(Opening, AHostMayCallWhileItsStaticsAreDestroyed) {
  Worker worker("call-last", {server()});
  worker.go();
  EXPECT_EQ(worker.lines(), std::vector<std::string>{"done"});
}

}  // namespace
}  // namespace QVSa::test
