#include <gtest/gtest.h>

#include "QVSa/frame/ConnectionString.h"
#include "QVSa/hosting/ServerInstallation.h"
#include "QVSa/identity/User.h"
#include "database/Scripts.h"
#include "providers/tsql/Parser.h"
#include "tests/support/TestInstallation.h"
#include "tests/support/TestServer.h"

namespace QVSa {
namespace {

// A server would refuse a view that is not alone in its batch, and a half that is repeated.
TEST(ServerInstallation, WritesAScriptWhoseDatabasesAreFilledAsAWhole) {
  const auto plain = [](const String& batch) { return trim(replaceAll(batch, "\n", " ")); };
  std::vector<String> batches;
  for (const String& batch : tsql::splitScript(ServerInstallation::script("db1|" + scrambleText("O'Brien"))))
    batches.push_back(plain(batch));
  const auto at = [&](const String& text, std::size_t from = 0) {
    for (std::size_t i = from; i < batches.size(); ++i)
      if (batches[i].find(text) != String::npos) return i;
    ADD_FAILURE() << text;
    return from;
  };
  EXPECT_NE(batches[at("create login QVUser")].find("password=N'O''Brien'"), String::npos);
  for (const auto& script : {database::qvSys, database::qvApp, database::qvUpdate}) {
    std::size_t place = 0;
    for (const String& batch : tsql::splitScript(String(script))) {
      const std::size_t next = at(plain(batch), place);
      EXPECT_EQ(batches[next], plain(batch));
      EXPECT_EQ(batches[next + 1], "if @@trancount=0 set noexec on");
      EXPECT_TRUE(place == 0 || next == place + 2);
      place = next;
    }
    EXPECT_EQ(batches[place + 2], "commit transaction");
    EXPECT_EQ(batches[place + 3], "set noexec off");
  }
}

TEST(ServerInstallation, IsLeftAloneByWhoMakesItAgain) {
  if (!test::onServer()) GTEST_SKIP() << "no server";
  const test::TestInstallation installation;
  User admin;
  const auto& server = test::TestServer::instance();
  ServerInstallation again;
  for (const char* password : {"Adm1n-first", "Adm1n-second"})
    EXPECT_TRUE(again.make(server.server(), "sa", server.administratorPassword(), password)) << again.errDescription();
  ASSERT_TRUE(admin.connect(server.server()));
  EXPECT_FALSE(admin.loginAuth("Admin", "Adm1n-second"));
  EXPECT_TRUE(admin.loginAuth("Admin", "Adm1n-first")) << admin.errDescription();
}

}  // namespace
}  // namespace QVSa
