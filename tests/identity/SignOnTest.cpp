#include <limits>

#include "platform/SecretMessage.h"
#include "platform/Services.h"
#include "tests/support/EnvironmentLocale.h"
#include "tests/support/Failures.h"
#include "tests/support/Scene.h"

namespace QVSa {
namespace {

struct Request {
  String login = "ann";
  String password = "right";
  String hostName = "pc1";
  String ipAddr{};
  Integer level = 0;
  String database = "QVApp";
};

// Ann, under a policy that locks at the third wrong password and lets a password live for 30 days.
class SignOn : public test::Scene {
 protected:
  SignOn() {
    savePolicy([](safeRule& rule) {
      rule.lockErr(true);
      rule.errTimes(3);
      rule.maxDay(30);
    });
    addUser("ann");
  }

  Boolean signOn(const Request& request = {}) {
    user_ = connected<User>(request.database);
    session_ = "left over";
    return user_.loginAuth(request.login, request.password, &session_, false, request.ipAddr, request.hostName,
                           &request.level);
  }
  void expectRefused(const Request& request, Long message) {
    EXPECT_FALSE(signOn(request));
    EXPECT_EQ(user_.errNumber(), messageNumber(message)) << user_.errDescription();
    EXPECT_EQ(session_, "");
  }
  void openSession(const String& login, const String& computer, const String& database) {
    tables_.run("insert into seslog(sesId,userLogin,computer,dbname) values('other" + text(++others_) + "','" + login +
                "','" + computer + "','" + database + "')");
  }
  void changeAnn(const String& assignments) {
    tables_.run("update users set " + assignments + " where userLogin='ann'");
  }
  // Wrong passwords in a row, state, time of the lock.
  String annsState() const { return tables_.text("select lgts,accstate,lockDate from users where userLogin='ann'"); }

  User user_;
  String session_;
  Long others_ = 0;
};

struct Outcome {
  const char* given;  // of Ann's row
  Request request;
  Boolean result;
  Long message;
  const char* state;
};

TEST_F(SignOn, IsAnsweredByTheFirstOfItsRefusals) {
  const Outcome outcomes[] = {
      {"lgts=0", {"nobody"}, false, 1101, "0|0|-"},
      {"uType=3", {}, false, 1131, "0|0|-"},
      {"ipList='10.0.0.1-9|10.0.1.*'", {.ipAddr = "10.0.0.10|10.0.2.1"}, false, 1132, "0|0|-"},
      {"lgts=2,accstate=1", {}, false, 1118, "0|1|-"},
      {"accstate=2", {}, false, 1118, "0|2|-"},
      {"accstate=3", {.password = "wrong"}, false, 1118, "1|3|-"},
      {"lgts=2", {.password = "wrong"}, false, 1118, "3|1|2024-03-07 10:00:00"},
      {"uType=1", {}, false, 1123, "1|0|-"},
      {"lgts=0", {.password = "Right"}, false, 1106, "1|0|-"},
      {"lgts=2,pwdDate='20240206 23:59:59'", {}, true, 1119, "0|0|-"},
  };
  // A machine without the packages of a domain and a directory.
  replace(&platform::Services::ntlmLogon, {});
  replace(&platform::Services::getUsersFromLD, {});
  for (const auto& [given, request, result, message, state] : outcomes) {
    changeAnn("lgts=0,accstate=0,lockDate=null,uType=0,ipList='',pwdDate=getdate()");
    changeAnn(given);
    EXPECT_EQ(signOn(request), result) << given;
    EXPECT_EQ(user_.errNumber(), messageNumber(message)) << given;
    EXPECT_EQ(session_, "") << given;
    EXPECT_EQ(annsState(), state) << given;
  }
  EXPECT_EQ(tables_.text("select count(*) from seslog"), "0");

  changeAnn("lgts=5,pwdDate='20240207'");
  EXPECT_TRUE(signOn());
  EXPECT_EQ(user_.errNumber(), 0);
  EXPECT_EQ(session_, "240307000001");
  EXPECT_EQ(annsState(), "0|0|-");
  tables_.run("delete from QVSys..idRule where idName='_ses'");
  expectRefused({}, 1502);
}

TEST_F(SignOn, AWrongPasswordCountsAlsoOnAComputerThatIsNotPermitted) {
  if (test::onServer()) GTEST_SKIP() << test::serversClock;
  changeAnn("ipList='10.0.0.7'");
  expectRefused({.password = "wrong", .ipAddr = "10.0.0.8"}, 1132);
  EXPECT_EQ(annsState(), "1|0|-");
  EXPECT_TRUE(signOn({.ipAddr = "10.0.0.8|10.0.0.7"})) << "one of his addresses will do";
  EXPECT_EQ(tables_.text("select * from seslog"),
            "240307000001|ann|pc1|QVApp|10.0.0.8|2024-03-07 10:00:00|-|2024-03-07 10:00:00");
}

TEST_F(SignOn, ALockLastsUntilTheUserIsSavedOrThePolicyLocksNoMore) {
  expectRefused({.password = "wrong"}, 1106);
  EXPECT_EQ(user_.Name(), "") << "the record is emptied";
  expectRefused({.password = "wrong"}, 1106);
  expectRefused({.password = "wrong"}, 1118);
  expectRefused({}, 1118);
  EXPECT_EQ(annsState(), "0|1|2024-03-07 10:00:00") << "the right password takes back the count alone";

  User saved = loaded("ann");
  saved.setJobs("1,");
  EXPECT_FALSE(saved.Save(true));
  EXPECT_TRUE(saved.locked());
  saved.setJobs("");
  EXPECT_TRUE(saved.Save(true));
  EXPECT_FALSE(saved.locked());
  EXPECT_EQ(annsState(), "0|0|-");
  EXPECT_TRUE(signOn());

  changeAnn("lgts=3,accstate=1,lockDate=getdate()");
  addUser("ben", [](User& user) { user.regState(2); });
  savePolicy([](safeRule& rule) { rule.lockErr(false); });
  EXPECT_EQ(annsState(), "3|0|-") << "the count stays";
  EXPECT_EQ(tables_.text("select accstate from users where userLogin='ben'"), "2") << "no lock, so not taken away";
  for (int i = 0; i < 4; ++i) expectRefused({.password = "wrong"}, 1106);
  EXPECT_EQ(annsState(), "3|0|-") << "nor is any counted";
}

TEST_F(SignOn, AnotherSessionCountsForANamedComputerTheSameDatabaseAndTheSameSpelling) {
  openSession("ann", "pc1", "QVApp");
  openSession("Ann", "pc2", "QVApp");
  openSession("ann", "pc2", "QVSys");
  openSession("ben", "pc2", "QVApp");
  EXPECT_TRUE(signOn()) << user_.errDescription();
  EXPECT_TRUE(signOn({.login = "ann ", .hostName = "pc1 "})) << "stored without the blank";
  openSession("ann", "PC1", "QVApp");
  expectRefused({}, 1133);
  EXPECT_EQ(user_.errDescription(), "The user has logged on computer [PC1].");
  expectRefused({.login = "ann "}, 1133);
  EXPECT_TRUE(signOn({.hostName = ""}));
  changeAnn("synLogin=1");
  EXPECT_TRUE(signOn());
}

TEST_F(SignOn, ADigestIsComparedInEitherCaseAndNeverCounted) {
  String digest = platform::md5Hex("right");
  for (char& c : digest) c = static_cast<char>(std::tolower(c));
  EXPECT_TRUE(signOn({.password = digest, .level = 1}));
  expectRefused({.password = "right", .level = 1}, 1106);
  EXPECT_EQ(annsState(), "0|0|-");

  auto user = connected<User>();
  EXPECT_TRUE(user.loginAuth_1("ann", digest));
  EXPECT_FALSE(user.loginAuth_1("ann", platform::md5Hex("Right")));
  EXPECT_EQ(user.errDescription(), "Invalid password.");
  changeAnn("accstate=1");
  EXPECT_TRUE(user.loginAuth_1("ann", digest)) << "the digest alone is asked";

  addUser("wide", [](User& wide) { wide.Pwd("密"); });
  {
    const test::EnvironmentLocale western("en_US.UTF-8");
    EXPECT_TRUE(user.loginAuth_1("wide", platform::md5Hex("?"))) << "its code page lacks the character";
  }
  const test::EnvironmentLocale chinese("zh_CN.UTF-8");
  EXPECT_EQ(test::failureOf([&] { signOn({.login = "wide", .level = 1}); }), number::overflow);
  EXPECT_EQ(test::failureOf([&] { user.loginAuth_1("wide", digest); }), number::overflow);
}

TEST_F(SignOn, WhereTheHostVouchesOnlyThePasswordIsNotAsked) {
  EXPECT_TRUE(signOn({.password = "", .level = 2}));
  changeAnn("ipList='10.0.0.7'");
  expectRefused({.password = "", .ipAddr = "10.0.0.8", .level = 2}, 1132);
  changeAnn("ipList='',lgts=3");
  expectRefused({.password = "", .level = 2}, 1118);
  changeAnn("lgts=0");
  openSession("ann", "pc2", "QVApp");
  expectRefused({.password = "", .level = 2}, 1133);
}

TEST_F(SignOn, APasswordLastsForTheDaysOfThePolicyFromItsLastChange) {
  if (test::onServer()) GTEST_SKIP() << test::serversClock;
  EXPECT_TRUE(signOn());
  EXPECT_EQ(user_.validDay(), 30);
  clock_.set(Date(2024, 4, 5, 23, 59, 59));
  EXPECT_TRUE(signOn());
  EXPECT_EQ(user_.validDay(), 1);
  EXPECT_NE(session_, "");
  String login = "ann";
  EXPECT_TRUE(user_.loginAuth(login, "right", &login, false, "", "pc1"))
      << "the session may come in the text of an argument";
  EXPECT_EQ(login, tables_.text("select max(sesId) from seslog"));

  clock_.set(Date(2024, 4, 6, 0, 0, 0));
  EXPECT_TRUE(signOn());
  EXPECT_EQ(user_.errNumber(), messageNumber(1119));
  EXPECT_EQ(session_, "");
  EXPECT_TRUE(user_.chgPwd("right", "other")) << user_.errDescription();
  EXPECT_TRUE(signOn({.password = "other"}));
  EXPECT_EQ(user_.validDay(), 30);

  changeAnn("pwdDate=null");
  EXPECT_TRUE(signOn({.password = "other"}));
  EXPECT_EQ(user_.errNumber(), messageNumber(1119));
  EXPECT_EQ(user_.validDay(), std::numeric_limits<Integer>::min()) << "as far as the number goes";
  EXPECT_EQ(session_, "");

  savePolicy([](safeRule& rule) { rule.maxDay(0); });
  EXPECT_TRUE(signOn({.password = "other"}));
  EXPECT_EQ(user_.validDay(), -1);
}

TEST_F(SignOn, AWrongPasswordOfTheConnectionIsToldWithoutIt) {
  for (const String& password : {scrambleText("mellow"), String("never scrambled")}) {
    User user;
    EXPECT_TRUE(user.connect(server() + "|" + password)) << "nothing is opened yet";
    EXPECT_EQ(refusal(user, user.GetOne(3, "ann")), number::login);
    EXPECT_EQ(user.errDescription(), "Login failed for user 'QVUser'.");
  }
  User user;
  EXPECT_TRUE(user.connect(server() + "|" + scrambleText(defaultDbPwd())) && user.GetOne(3, "ann"));
}

}  // namespace
}  // namespace QVSa
