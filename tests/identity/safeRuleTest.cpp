#include <gtest/gtest.h>

#include "QVSa/identity/safeRule.h"
#include "QVSa/resources/Messages.h"
#include "tests/support/FakeSession.h"

namespace QVSa {
namespace {

TEST(SafeRule, TellsEachThingThatAPasswordLacks) {
  const String shortOne = fillMsg(LoadResString(3001), {6});
  const String cases = LoadResString(3002), kinds = LoadResString(3003), special = LoadResString(3004);
  const struct {
    Integer minLen;
    bool caseMixed, numCharMixed, hasSpecialChar;
    const char* password;
    String problems;
  } judged[] = {{6, false, false, false, "", shortOne},
                {6, false, false, false, "密码密码密", shortOne},
                {6, false, false, false, "密码密码密码", ""},
                {0, true, true, false, "abc", cases + kinds},
                {0, true, true, false, "123", cases + kinds},
                {0, true, true, false, "ABC1", cases},
                {0, true, true, false, "aB1", ""},
                {0, false, false, true, "aB1", special},
                {0, false, false, true, "", special},
                {0, false, false, true, "aB 1", ""},
                {0, false, false, true, "密", ""}};
  for (const auto& [minLen, caseMixed, numCharMixed, hasSpecialChar, password, problems] : judged) {
    safeRule rule;
    rule.minLen(minLen);
    rule.caseMixed(caseMixed);
    rule.numCharMixed(numCharMixed);
    rule.hasSpecialChar(hasSpecialChar);
    EXPECT_EQ(rule.checkPwd(password), problems.empty()) << password;
    EXPECT_EQ(rule.errDescription(), problems) << password;
    EXPECT_TRUE(problems.empty() || rule.errNumber() == messageNumber(3000)) << password;
  }
}

TEST(SafeRule, APolicyReadHalfWayIsNotJudgedBy) {
  test::FakeServer server;
  server.answer("select * from saferule where id=1",
                {{{"minLen"}, {"maxDay"}, {"charSet"}}, {{Integer{6}, Integer{30}, "111"}}});
  safeRule rule;
  rule.connect("host");
  EXPECT_FALSE(rule.GetOne());
  EXPECT_TRUE(rule.checkPwd("")) << rule.errDescription();
  EXPECT_EQ(rule.maxDay(), 0);
}

}  // namespace
}  // namespace QVSa
