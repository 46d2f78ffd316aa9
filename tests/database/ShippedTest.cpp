#include <regex>

#include "database/Scripts.h"
#include "tests/database/Shipped.h"
#include "tests/support/Cases.h"
#include "tests/support/TestServer.h"

namespace QVSa::test {

TEST(ShippedDatabases, AnswerTheirCases) {
  if (onServer()) GTEST_SKIP() << serversClock;
  runCases(std::filesystem::path(QVSA_SOURCE_DIR) / "tests/database", TestInstallation::Content::shipped);
}

TEST_F(Shipped, EverySystemTableAndViewAnswersUnderTheApplicationDatabase) {
  const String script(database::qvSys);
  const std::regex definition(R"(\ncreate (table|view) (\w+))");
  int names = 0;
  for (std::sregex_iterator found(script.begin(), script.end(), definition), end; found != end; ++found, ++names) {
    const String name = (*found)[2];
    EXPECT_NO_THROW(rows("select count(*) from " + name, "QVApp")) << name;
  }
  EXPECT_GT(names, 30);
  EXPECT_EQ(rows("select userLogin from users where userId=1", "QVApp"), (Lines{"Admin"}));
}

}  // namespace QVSa::test
