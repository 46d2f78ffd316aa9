#include <gtest/gtest.h>
#include <random>

#include "QVSa/frame/ConnectionString.h"
#include "QVSa/frame/DeploymentSecrets.h"
#include "QVSa/values/Text.h"
#include "providers/Provider.h"
#include "tests/support/Failures.h"

namespace QVSa {

using test::failureOf;

TEST(ConnectionString, IsBuiltFromServerAndDatabase) {
  EXPECT_EQ(buildConnString("db1", "", false),
            "provider=sqloledb;data source=db1;database=QVSys;uid=QVUser;pwd=" + defaultDbPwd() + ";");
  EXPECT_EQ(buildConnString("db1,1433|" + scrambleText("secret"), "QVApp", false),
            "provider=sqloledb;data source=db1,1433;database=QVApp;uid=QVUser;pwd=secret;");
  EXPECT_EQ(buildConnString("db1,1433|AB", "QVApp", false),
            "provider=sqloledb;data source=db1,1433;database=QVApp;uid=QVUser;pwd=;");
  EXPECT_EQ(serverOnly("a|b|c"), "a");
  EXPECT_EQ(serverOnly("a"), "a");
}

TEST(ConnectionString, OfAnIntegratedLoginHoldsNoPassword) {
  EXPECT_EQ(buildConnString("db1|" + scrambleText("secret"), "", true),
            "PROVIDER=SQLOLEDB;DATA SOURCE=db1;Integrated Security=sspi;DATABASE=QVSys");
  EXPECT_EQ(buildConnString("<pwd>", "", true).find(defaultDbPwd()), String::npos);
}

TEST(ConnectionString, ItsPartsAreReadBack) {
  const ConnectionOptions login = parseConnectionString(buildConnString("file:/srv/qv sa", "QVApp", false));
  EXPECT_EQ(login.provider, "sqloledb");
  EXPECT_EQ(login.dataSource, "file:/srv/qv sa");
  EXPECT_EQ(login.database, "QVApp");
  EXPECT_EQ(login.user, "QVUser");
  EXPECT_EQ(login.password, defaultDbPwd());
  EXPECT_FALSE(login.integrated);

  const ConnectionOptions own = parseConnectionString(buildConnString("db1,1433", "", true));
  EXPECT_EQ(own.dataSource, "db1,1433");
  EXPECT_EQ(own.database, "QVSys");
  EXPECT_TRUE(own.integrated);
}

TEST(ConnectionString, KeywordsHaveAnyCaseAndValuesStandAsTheyAre) {
  const ConnectionOptions options =
      parseConnectionString(" Data Source =h;PWD= a=b ;UID=x; application name=y;INTEGRATED SECURITY=false; ");
  EXPECT_EQ(options.dataSource, "h");
  EXPECT_EQ(options.password, " a=b ");
  EXPECT_EQ(options.user, "x");
  EXPECT_FALSE(options.integrated);
}

TEST(ConnectionString, WithoutADataSourceOrCutShortItIsRefused) {
  for (const char* text : {"", "pwd=x;", "data source=;database=QVSys"})
    EXPECT_EQ(failureOf([&] { parseConnectionString(text); }), number::general) << text;
  for (const char* server : {"file:/srv/a;b", "file:/srv/a;b=c", "file:/srv/a;database=X", "file:/srv/a;data source=h"})
    EXPECT_EQ(failureOf([&] { parseConnectionString(buildConnString(server, "", false)); }), number::general) << server;
}

TEST(DefaultDbPwd, IsAsciiWithoutASemicolonAndJoinedInOrder) {
  const String password = defaultDbPwd();
  EXPECT_EQ(password.find_first_of(";|'\" "), String::npos);
  for (const char c : password) EXPECT_TRUE(c > ' ' && c < 0x7F);
  EXPECT_EQ(password, String(secrets::connPwdHead) + std::to_string(secrets::connPwdNumber) +
                          scrambleText(secrets::connPwdWordA) + scrambleText(lowerCase(secrets::connPwdWordB)) +
                          secrets::connPwdTail);
}

TEST(Scramble, KnownTextsKeepTheirForm) {
  EXPECT_EQ(scrambleText(""), "");
  EXPECT_EQ(unscrambleText(""), "");
  // 13 * 97 = 4 * 256 + 237
  EXPECT_EQ(scrambleText("a"), "NM@D");
  // 13 * 98 = 4 * 256 + 250, and the carry 4 of the letter before: 254
  EXPECT_EQ(scrambleText("ab"), "NMON@D");
}

TEST(Scramble, EveryTextThatHasAFormIsReadBack) {
  std::mt19937 random(20240229);
  std::uniform_int_distribution<int> length(1, 12);
  std::uniform_int_distribution<int> letter(1, 127);
  int refused = 0;
  for (int round = 0; round < 20000; ++round) {
    String plain(static_cast<std::size_t>(length(random)), ' ');
    for (char& c : plain) c = static_cast<char>(letter(random));
    String scrambled;
    if (failureOf([&] { scrambled = scrambleText(plain); }) != 0) {
      ++refused;
      continue;
    }
    ASSERT_EQ(scrambled.size(), 2 * (plain.size() + 1));
    ASSERT_EQ(scrambled.find_first_not_of("@ABCDEFGHIJKLMNO"), String::npos);
    ASSERT_EQ(unscrambleText(scrambled), plain);
  }
  EXPECT_GT(refused, 0);
  EXPECT_LT(refused, 6000);
}

TEST(Scramble, RefusesWhatNoByteCanCarry) {
  // 13 * 59 = 2 * 256 + 255, and the carry 6 of the letter before goes beyond a byte.
  EXPECT_EQ(failureOf([] { scrambleText("z;"); }), number::argument);
  EXPECT_EQ(scrambleText(";").size(), 4U);
  EXPECT_EQ(failureOf([] { scrambleText("部"); }), number::argument);
}

TEST(Scramble, GarbageIsReadAsGarbage) {
  for (const char* garbage : {"x", "xyz", "zzzzzz", "    ", "部门😀!", "\xFF\xFE\xFD\xFC", "@@@@@@"})
    EXPECT_EQ(failureOf([&] { unscrambleText(garbage); }), 0) << garbage;
}

}  // namespace QVSa
