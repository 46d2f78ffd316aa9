#include <fstream>
#include <limits>
#include <sstream>

#include "platform/SecretMessage.h"
#include "platform/Services.h"
#include "tests/support/EnvironmentLocale.h"
#include "tests/support/Failures.h"
#include "tests/support/RecordingProvider.h"
#include "tests/support/Scene.h"

namespace QVSa {
namespace {

using test::Lines;
using test::RecordingProvider;

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
  const char* name;
  String given;  // a batch that makes the case
  Request request;
  Boolean result;
  Long errNumber;
  String errDescription;
  String state;
  String sessions;
  String id{};
};

const Outcome outcomes[] = {
    {"NoSuchUser", "", {"nobody"}, false, messageNumber(1101), "User does not exist.", "0|0|-", "0"},
    {"TheLoadFails",
     "",
     {.database = "QVUpdate"},
     false,
     number::noTable,
     "Invalid object name 'users'.",
     "0|0|-",
     "0"},
    {"TheDirectoryDoesNotKnowHim",
     "update users set uType=3 where userLogin='ann'",
     {},
     false,
     messageNumber(1131),
     "The user does not exist in LDAP directory.",
     "0|0|-",
     "0"},
    {"TheAddressIsNotPermitted",
     "update users set ipList='10.0.0.1-9|10.0.1.*' where userLogin='ann'",
     {.ipAddr = "10.0.0.10|10.0.2.1"},
     false,
     messageNumber(1132),
     "It is not allowed to login from this computer.",
     "0|0|-",
     "0"},
    {"HeIsSignedOnAtAnotherComputer",
     "insert into seslog(sesId,userLogin,computer,dbname) values('s','ann','pc2','QVApp')",
     {},
     false,
     messageNumber(1133),
     "The user has logged on computer [pc2].",
     "0|0|-",
     "1"},
    {"TheAccountIsLocked",
     "update users set lgts=2,accstate=1 where userLogin='ann'",
     {},
     false,
     messageNumber(1118),
     "The account has been locked.",
     "0|1|-",
     "0"},
    {"TheAccountWaitsForAudit",
     "update users set accstate=2 where userLogin='ann'",
     {},
     false,
     messageNumber(1118),
     "The account has been locked.",
     "0|2|-",
     "0"},
    {"TheAccountWasRefusedAtAudit",
     "update users set accstate=3 where userLogin='ann'",
     {.password = "wrong"},
     false,
     messageNumber(1118),
     "The account has been locked.",
     "1|3|-",
     "0"},
    {"TheThirdWrongPassword",
     "update users set lgts=2 where userLogin='ann'",
     {.password = "wrong"},
     false,
     messageNumber(1118),
     "The account has been locked.",
     "3|1|2024-03-07 10:00:00",
     "0"},
    {"AWrongDomainPassword",
     "update users set uType=1 where userLogin='ann'",
     {},
     false,
     messageNumber(1123),
     "The password is incorrect, or domain account is incorrect.",
     "1|0|-",
     "0"},
    {"AWrongPassword", "", {.password = "Right"}, false, messageNumber(1106), "Invalid password.", "1|0|-", "0"},
    {"AnExpiredPassword",
     "update users set lgts=2,pwdDate='20240206 23:59:59' where userLogin='ann'",
     {},
     true,
     messageNumber(1119),
     "Password expired, please reset your password.",
     "0|0|-",
     "0"},
    {"TheSessionGetsNoNumber",
     "delete from QVSys..idRule where idName='_ses'",
     {},
     false,
     messageNumber(1502),
     "Table ID is empty.",
     "0|0|-",
     "0"},
    {"SignedOn",
     "update users set lgts=2,pwdDate='20240207' where userLogin='ann'",
     {},
     true,
     0,
     "",
     "0|0|-",
     "1",
     "240307000001"},
};

void PrintTo(const Outcome& outcome, std::ostream* out) { *out << outcome.name; }

// On a machine without the packages of a domain and a directory: what these say has tests of its own. The clock gives
// the packages back at its end.
class OutcomeOfASignOn : public SignOn, public testing::WithParamInterface<Outcome> {
 protected:
  OutcomeOfASignOn() {
    platform::Services services = platform::services();
    services.ntlmLogon = nullptr;
    services.getUsersFromLD = nullptr;
    platform::replaceServices(services);
  }
};

TEST_P(OutcomeOfASignOn, IsReportedAndStandsInTheTables) {
  const Outcome& expected = GetParam();
  if (!expected.given.empty()) tables_.run(expected.given);
  EXPECT_EQ(signOn(expected.request), expected.result);
  EXPECT_EQ(user_.errNumber(), expected.errNumber);
  EXPECT_EQ(user_.errDescription(), expected.errDescription);
  EXPECT_EQ(session_, expected.id);
  EXPECT_EQ(annsState(), expected.state);
  EXPECT_EQ(tables_.text("select count(*) from seslog"), expected.sessions);
}

INSTANTIATE_TEST_SUITE_P(SignOn, OutcomeOfASignOn, testing::ValuesIn(outcomes),
                         [](const auto& outcome) { return outcome.param.name; });

TEST_F(SignOn, AWrongPasswordCountsAlsoOnAComputerThatIsNotPermitted) {
  changeAnn("ipList='10.0.0.7'");
  expectRefused({.password = "wrong", .ipAddr = "10.0.0.8"}, 1132);
  EXPECT_EQ(annsState(), "1|0|-");
  EXPECT_TRUE(signOn({.ipAddr = "10.0.0.8|10.0.0.7"})) << "one of his addresses will do";
  EXPECT_EQ(tables_.text("select ip from seslog"), "10.0.0.8") << "the first one is written down";
}

TEST_F(SignOn, ALockLastsUntilTheUserIsSavedOrThePolicyLocksNoMore) {
  expectRefused({.password = "wrong"}, 1106);
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
}

TEST_F(SignOn, WithoutLocksInThePolicyNothingIsCounted) {
  savePolicy([](safeRule& rule) { rule.lockErr(false); });
  for (int i = 0; i < 5; ++i) expectRefused({.password = "wrong"}, 1106);
  EXPECT_EQ(annsState(), "0|0|-");
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

TEST_F(SignOn, TheSessionMayComeInTheTextOfAnArgument) {
  auto user = connected<User>();
  String login = "ann";
  EXPECT_TRUE(user.loginAuth(login, "right", &login)) << user.errDescription();
  EXPECT_EQ(login, tables_.text("select sesId from seslog"));
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
  EXPECT_TRUE(signOn());
  EXPECT_EQ(user_.validDay(), 30);
  clock_.set(Date(2024, 4, 5, 23, 59, 59));
  EXPECT_TRUE(signOn());
  EXPECT_EQ(user_.validDay(), 1);
  EXPECT_NE(session_, "");

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

TEST_F(SignOn, ItsStatementsAreThoseOfTheGoldenFile) {
  addUser("ben", [](User& user) {
    user.deptId("_out");
    user.ipList("10.0.0.*");
  });
  std::ostringstream actual;
  {
    RecordingProvider recorder;
    user_ = connected<User>();
    EXPECT_TRUE(user_.loginAuth("ben", "right", &session_, false, "10.0.0.5", "pc1"));
    for (const String& event : recorder.log()) actual << event << '\n';
  }
  EXPECT_EQ(tables_.text("select * from seslog"),
            "240307000001|ben|pc1|QVApp|10.0.0.5|2024-03-07 10:00:00|-|2024-03-07 10:00:00");

  std::ostringstream golden;
  golden << std::ifstream(QVSA_SOURCE_DIR "/tests/signon/sign_on.golden").rdbuf();
  if (actual.str() == golden.str()) return;
  std::ofstream("sign_on.actual") << actual.str();
  FAIL() << "compare sign_on.actual, in this test's working directory, with tests/signon/sign_on.golden";
}

}  // namespace
}  // namespace QVSa
