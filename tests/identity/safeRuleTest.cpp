#include <gtest/gtest.h>

#include "QVSa/identity/safeRule.h"
#include "QVSa/resources/Messages.h"
#include "tests/support/FakeSession.h"

namespace QVSa {
namespace {

constexpr Long againstPolicy = messageNumber(3000);

TEST(SafeRule, TheLengthCountsCharactersAndNotBytes) {
  safeRule rule;
  rule.minLen(6);
  EXPECT_FALSE(rule.checkPwd(""));
  EXPECT_EQ(rule.errNumber(), againstPolicy);
  EXPECT_EQ(rule.errDescription(), fillMsg(LoadResString(3001), {6}));
  EXPECT_NE(rule.errDescription().find("[6]"), String::npos);
  EXPECT_FALSE(rule.checkPwd("密码密码密"));
  EXPECT_TRUE(rule.checkPwd("密码密码密码"));
}

TEST(SafeRule, EveryMissingKindOfCharacterIsTold) {
  safeRule rule;
  rule.caseMixed(true);
  rule.numCharMixed(true);
  EXPECT_FALSE(rule.checkPwd("abc"));
  EXPECT_EQ(rule.errNumber(), againstPolicy);
  EXPECT_EQ(rule.errDescription(), LoadResString(3002) + LoadResString(3003));
  EXPECT_FALSE(rule.checkPwd("123"));
  EXPECT_FALSE(rule.checkPwd("ABC1"));
  EXPECT_EQ(rule.errDescription(), LoadResString(3002));
  EXPECT_TRUE(rule.checkPwd("aB1"));
  EXPECT_EQ(rule.errDescription(), "") << "a success empties the text";
}

TEST(SafeRule, AnyCharacterBesidesLettersAndDigitsIsASpecialOne) {
  safeRule rule;
  rule.hasSpecialChar(true);
  EXPECT_FALSE(rule.checkPwd("aB1"));
  EXPECT_EQ(rule.errDescription(), LoadResString(3004));
  EXPECT_FALSE(rule.checkPwd(""));
  EXPECT_TRUE(rule.checkPwd("aB 1"));
  EXPECT_TRUE(rule.checkPwd("密"));
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
