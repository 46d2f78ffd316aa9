#include <gtest/gtest.h>

#include "QVSa/identity/internal/IpRules.h"
#include "QVSa/identity/safeRule.h"
#include "QVSa/resources/Messages.h"
#include "platform/SecretMessage.h"
#include "tests/support/FakeSession.h"
#include "tests/support/Scene.h"

namespace QVSa {
namespace {

using test::Lines;

TEST(IpRules, MatchOneAddressAStarForItsLastPartOrARangeThere) {
  const std::pair<const char*, const char*> matches[] = {{"10.0.0.5", " 10.0. 0.5 "}, {"fe80::1", "fe80::1"},
                                                         {"10.0.0.5", "10.0.0.*"},    {"10.0.0.1", "10.0.0.1-9"},
                                                         {"10.0.0.9", "10.0.0.1-9"},  {"10.0.0.10", "10.0.0.9-11"}};
  for (const auto& [address, rule] : matches) EXPECT_TRUE(ipMatchesOne(address, rule)) << address << " " << rule;
  for (const char* rule : {"10.0.0.50", "*", "10.0.1.*", "10.0.*.5", "10.0.0.5*", "10.0.0.6-9", "10.0.0.1-4",
                           "10.0.1.1-9", "10.0.0.-", "10.0.0.1-", "10.0.0.-9", "10.0.0.1-9-12", "10.0.0.a-z"})
    EXPECT_FALSE(ipMatchesOne("10.0.0.5", rule)) << rule;
  EXPECT_FALSE(ipMatchesOne("fe80::1", "10.0.0.*"));
}

TEST(IpRules, OneMatchingPatternOfTheListIsEnoughAndAnEmptyListPermitsNothing) {
  EXPECT_TRUE(ipMatches("10.0.0.5", "192.168.1.*|10.0.0.1-9"));
  EXPECT_FALSE(ipMatches("10.0.0.15", "192.168.1.*|10.0.0.1-9"));
  EXPECT_FALSE(ipMatches("", ""));
}

// Ann, under a policy that keeps three passwords. Each change is made an hour after the last one.
class Passwords : public test::Scene {
 protected:
  Passwords() {
    savePolicy([](safeRule& rule) { rule.cycle(3); });
    addUser("ann");
    ann_ = loaded("ann");
  }

  Boolean change(const String& from, const String& to) {
    clock_.set(Date(2024, 3, 7, 10 + ++hours_));
    return ann_.chgPwd(from, to);
  }
  Lines history() const { return tables_.rows("select creDate from userPwdHis where userId=2 order by creDate"); }

  User ann_;
  int hours_ = 0;
};

TEST_F(Passwords, AsManyAsThePolicySaysAreKeptAndRefused) {
  if (test::onServer()) GTEST_SKIP() << test::serversClock;
  EXPECT_FALSE(change("Right", "two"));
  EXPECT_EQ(ann_.errDescription(), "Error in inputing old password.");
  EXPECT_FALSE(change("right", "right"));
  EXPECT_EQ(ann_.errNumber(), messageNumber(1120));
  EXPECT_EQ(ann_.errDescription(), "Set duplicate password [3] times recently.");
  EXPECT_TRUE(change("right", "two"));
  EXPECT_TRUE(change("two", "three"));
  EXPECT_FALSE(change("three", "right"));
  EXPECT_TRUE(change("three", "four"));
  EXPECT_EQ(history(), (Lines{"2024-03-07 13:00:00", "2024-03-07 14:00:00", "2024-03-07 16:00:00"}));
  EXPECT_TRUE(change("four", "RIGHT")) << "passwords differ by case";
  EXPECT_TRUE(change("RIGHT", "right")) << "the first one is forgotten";
  EXPECT_EQ(history().size(), 3U);
  EXPECT_TRUE(loaded("ann").chgPwd("right", "last"));
}

TEST_F(Passwords, ASaveKeepsTheHistoryToo) {
  if (test::onServer()) GTEST_SKIP() << test::serversClock;
  EXPECT_EQ(history(), (Lines{"2024-03-07 10:00:00"})) << "the first password";
  EXPECT_EQ(refusal(ann_, ann_.Save()), messageNumber(1120)) << "an unchanged password is refused as well";
  EXPECT_EQ(ann_.errDescription(), "Set duplicate password @ times recently.");
  EXPECT_TRUE(ann_.Save(true));
  EXPECT_EQ(history().size(), 1U) << "nor was the policy asked for the length of the history";

  clock_.set(Date(2024, 3, 8));
  ann_.Pwd("two");
  EXPECT_TRUE(ann_.Save());
  EXPECT_EQ(history(), (Lines{"2024-03-07 10:00:00", "2024-03-08 00:00:00"}));
  EXPECT_EQ(tables_.text("select pwdDate from users where userId=2"), "2024-03-08 00:00:00");
}

TEST_F(Passwords, UnderANewNameThePasswordIsStoredAnewAndTheOldOnesReadNoMore) {
  EXPECT_TRUE(change("right", "two"));
  ann_.Name("王小明");
  EXPECT_TRUE(ann_.Save(true));
  ann_ = loaded("ann");
  EXPECT_EQ(ann_.Name(), "王小明");
  EXPECT_TRUE(change("two", "right")) << ann_.errDescription();
}

TEST_F(Passwords, ABlankBehindTheNameShutsNobodyOutAndLetsNobodyIn) {
  const auto opens = [&](const String& login, const String& password) {
    return connected<User>().loginAuth(login, password);
  };
  auto ben = connected<User>();
  ben.Name("Ben  ");
  ben.Login("ben");
  ben.Pwd("one");
  ASSERT_TRUE(ben.Save());
  EXPECT_TRUE(opens("ben", "one"));
  EXPECT_FALSE(opens("ben", ""));
  EXPECT_TRUE(ben.chgPwd("one", "two")) << "on the object just saved";
  EXPECT_TRUE(opens("ben", "two"));
  EXPECT_EQ(refusal(ben, ben.chgPwd("two", "one")), messageNumber(1120)) << "the history is read under the same name";
  ann_.Name("Anna ");
  ASSERT_TRUE(ann_.Save(true));
  EXPECT_TRUE(opens("ann", "right"));
  // Another program's row, with the blank.
  tables_.run("update users set userName='Anna   ',userPwd='" + platform::encryptText("right", "Anna   ") +
              "' where userLogin='ann'");
  EXPECT_TRUE(opens("ann", "right"));
  EXPECT_TRUE(loaded("ann").chgPwd("right", "new"));
  EXPECT_TRUE(opens("ann", "new"));
  auto guest = connected<User>();
  guest.Name("Guest ");
  guest.Login("guest");
  guest.Pwd("one");
  ASSERT_TRUE(guest.Reg("Sales")) << guest.errDescription();
  ASSERT_TRUE(guest.regAudit(true));
  EXPECT_TRUE(opens("guest", "one"));
}

TEST_F(Passwords, ThatDoNotDecryptOpenNothingAndAreKept) {
  const String foreign = platform::encryptText("right", "of another key");
  const auto stored = [&] { return tables_.text("select userPwd from users where userLogin='ann'"); };
  for (const String& text : {foreign, String("no message")}) {
    tables_.run("update users set userPwd='" + text + "' where userLogin='ann'");
    auto user = connected<User>();
    for (const char* guess : {"", "right"}) {
      EXPECT_FALSE(user.loginAuth("ann", guess)) << guess;
      EXPECT_FALSE(user.loginAuth_1("ann", platform::md5Hex(guess))) << guess;
      EXPECT_FALSE(loaded("ann").chgPwd(guess, "mine")) << guess;
    }
    user = loaded("ann");
    user.Name("Anna");
    EXPECT_TRUE(user.Save(true));
    EXPECT_EQ(stored(), text);
  }
  auto user = loaded("ann");
  user.Pwd("");
  EXPECT_TRUE(user.Save()) << "nor do those of the history, which so are not the empty one";
  EXPECT_TRUE(user.loginAuth("ann", "")) << "set, and so the empty one";
}

TEST_F(Passwords, AreChangedOnTheObjectOfAUserAlone) {
  auto user = connected<User>();
  EXPECT_EQ(refusal(user, user.chgPwd("", "mine")), messageNumber(1121)) << "nobody was loaded";
  EXPECT_FALSE(user.loginAuth("ann", "wrong"));
  EXPECT_EQ(refusal(user, user.chgPwd("", "mine")), messageNumber(1121)) << "refused at his sign-on";
  auto users = connected<Users>();
  ASSERT_TRUE(users.GetAll());
  EXPECT_FALSE(users.Item("Ann")->chgPwd("", "mine")) << "a list has no passwords";
  EXPECT_TRUE(user.loginAuth("ann", "right")) << user.errDescription();
  EXPECT_TRUE(user.chgPwd("right", "mine"));
}

TEST_F(Passwords, ThePolicyHoldsForEveryChangeButForTheSaveOfForeignAccounts) {
  savePolicy([](safeRule& rule) { rule.minLen(6); });
  const String problem = "The length of password is less than [6] .";
  EXPECT_FALSE(change("right", "abc"));
  EXPECT_EQ(ann_.errNumber(), messageNumber(3000));

  for (const Integer type : {Genaral, adUser, autoReg, ldapUser}) {
    auto user = connected<User>();
    user.Name("Ben");
    user.Login("ben" + text(type));
    user.Pwd("abc");
    user.uType(type);
    EXPECT_EQ(user.Save(), type != Genaral);
    EXPECT_EQ(user.errDescription(), type == Genaral ? problem : "");
  }
  EXPECT_EQ(history().size(), 1U);
}

TEST_F(Passwords, APolicyWithoutARowIsMadeByItsFirstSave) {
  tables_.run("delete from saferule");
  auto rule = connected<safeRule>();
  EXPECT_TRUE(rule.GetOne());
  EXPECT_TRUE(rule.checkPwd(""));
  rule.minLen(6);
  rule.lockErr(true);
  rule.hasSpecialChar(true);
  EXPECT_TRUE(rule.Save());
  EXPECT_EQ(tables_.text("select * from saferule"), "1|6|0|001|0|0|-1|0|0|0|0");
  EXPECT_FALSE(rule.checkPwd("longer"));
  EXPECT_TRUE(rule.checkPwd("密码密码密码")) << "any other character will do";
  tables_.run("delete from saferule");
  EXPECT_TRUE(rule.GetOne());
  EXPECT_EQ(rule.minLen(), 0);
  EXPECT_FALSE(rule.lockErr() || rule.hasSpecialChar());
}

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
