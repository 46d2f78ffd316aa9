#include "QVSa/frame/ConnectionString.h"
#include "QVSa/identity/User.h"
#include "QVSa/settings/Home.h"
#include "QVSa/values/Text.h"
#include "platform/SecretMessage.h"
#include "tests/support/SettingsScene.h"

namespace QVSa {
namespace {

struct TextSetting {
  const char* column;
  String (Home::*get)() const;
  void (Home::*set)(String);
};
const TextSetting texts[] = {{"companyName", &Home::homeName, &Home::homeName},
                             {"companyEnName", &Home::enName, &Home::enName},
                             {"address", &Home::Address, &Home::Address},
                             {"zip", &Home::zipcode, &Home::zipcode},
                             {"tel", &Home::Tel, &Home::Tel},
                             {"fax", &Home::Fax, &Home::Fax},
                             {"email", &Home::Email, &Home::Email},
                             {"webUrl", &Home::website, &Home::website},
                             {"bankName", &Home::bankName, &Home::bankName},
                             {"BankAccount", &Home::bankAccount, &Home::bankAccount},
                             {"TaxNo", &Home::taxNo, &Home::taxNo},
                             {"JPerson", &Home::jPerson, &Home::jPerson},
                             {"attLimit", &Home::attLimit, &Home::attLimit},
                             {"regPrompt", &Home::regPrompt, &Home::regPrompt},
                             {"smtpServer", &Home::smtpServer, &Home::smtpServer},
                             {"emailSender", &Home::emailSender, &Home::emailSender},
                             {"emailAddress", &Home::emailAddress, &Home::emailAddress},
                             {"emailSubject", &Home::emailSubject, &Home::emailSubject},
                             {"emailContent", &Home::emailContent, &Home::emailContent},
                             {"emailPContent", &Home::emailPContent, &Home::emailPContent},
                             {"emailRContent", &Home::emailRContent, &Home::emailRContent},
                             {"LDSName", &Home::ldServerName, &Home::ldServerName},
                             {"LDHost", &Home::ldHost, &Home::ldHost},
                             {"LDBaseDN", &Home::ldBaseDN, &Home::ldBaseDN},
                             {"LDBindDN", &Home::ldBindDN, &Home::ldBindDN}};

struct Flag {
  const char* column;
  Boolean (Home::*get)() const;
  void (Home::*set)(Boolean);
  Boolean onNull;
};
const Flag flags[] = {{"smState", &Home::SMIsOpen, &Home::SMIsOpen, false},
                      {"savePwd", &Home::SavePwd, &Home::SavePwd, false},
                      {"useOTPAuth", &Home::useOTPAuth, &Home::useOTPAuth, false},
                      {"allowOuter", &Home::allowOuter, &Home::allowOuter, false},
                      {"roleGrp", &Home::allowRoleGrp, &Home::allowRoleGrp, false},
                      {"domainUser", &Home::allowDomainUser, &Home::allowDomainUser, false},
                      {"autoRegUser", &Home::allowRegUser, &Home::allowRegUser, false},
                      {"allowSendEmail", &Home::allowSendEmail, &Home::allowSendEmail, true},
                      {"smtpState", &Home::allowSMTP, &Home::allowSMTP, false},
                      {"smtpUseSSL", &Home::smtpUseSSL, &Home::smtpUseSSL, false},
                      {"ldEnable", &Home::ldEnabled, &Home::ldEnabled, false}};

class HomeTest : public test::SettingsScene {};

TEST_F(HomeTest, EverySettingGoesRoundThroughItsOwnColumn) {
  Home home = connected<Home>();
  for (const TextSetting& setting : texts) (home.*setting.set)(String(setting.column) + " d'\xC3\x84");
  home.ldEnabled(true);
  home.AcctDay(25);
  home.acctTime(-3);
  home.timeOut(90000);
  home.smtpPort(2525);
  home.smtpAuth(2);
  home.emailPassword("Mail-Secret");
  home.ldPasswd("abc");
  home.LoginNewsUrl("http://news");
  home.loginTitle("Welcome");
  ASSERT_TRUE(home.Save()) << home.errDescription();

  const Home again = connected<Home>();
  for (const TextSetting& setting : texts) {
    EXPECT_EQ(stored(setting.column), String(setting.column) + " d'\xC3\x84");
    EXPECT_EQ((again.*setting.get)(), String(setting.column) + " d'\xC3\x84") << setting.column;
  }
  EXPECT_EQ(again.AcctDay(), 25);
  EXPECT_EQ(again.acctTime(), -3);
  EXPECT_EQ(again.timeOut(), 90000);
  EXPECT_EQ(again.smtpPort(), 2525);
  EXPECT_EQ(again.smtpAuth(), 2);
  EXPECT_EQ(again.emailPassword(), "Mail-Secret");
  EXPECT_EQ(platform::decryptText(stored("emailPassword"), "smtpServer d'\xC3\x84"), "Mail-Secret");
  EXPECT_EQ(stored("LDPasswd"), scrambleText("abc"));
  EXPECT_EQ(stored("LoginNewsUrl+'|'+loginTitle"), "http://news|Welcome");
  EXPECT_EQ(again.loginTitle(), "") << "getImage alone reads it";
  EXPECT_EQ(tables_.text("select deptName,fullName from departments where deptNo='_root'"),
            "companyName d'\xC3\x84|companyName d'\xC3\x84");
}

TEST_F(HomeTest, EveryFlagIsStoredInItsOwnColumnAndOnlyOneIsTrueThere) {
  Home home = connected<Home>();
  for (const Flag& flag : flags) {
    String columns, expected;
    for (const Flag& other : flags) {
      const bool isSet = &other == &flag;
      (home.*other.set)(isSet);
      columns += (columns.empty() ? "" : ",") + String(other.column);
      expected += (expected.empty() ? "" : "|") + String(isSet ? "1" : "0");
    }
    ASSERT_TRUE(home.Save()) << home.errDescription();
    EXPECT_EQ(stored(columns), expected) << flag.column;
    EXPECT_TRUE((connected<Home>().*flag.get)()) << flag.column;
    for (const char* other : {"0", "-1", "2", "null"}) {
      store(flag.column + ("=" + String(other)));
      EXPECT_EQ((connected<Home>().*flag.get)(), other[0] == 'n' && flag.onNull) << flag.column << " " << other;
    }
  }
}

TEST_F(HomeTest, ANullReadsAsItsOwnDefaultAndFailsTheDaysOfAccount) {
  store("ldEnable=1,timeOut=null,smtpPort=null,smtpAuth=null,emailPassword=null,LDport=null,LDPasswd=null");
  Home home;
  for (const TextSetting& setting : texts) {
    store(String(setting.column) + "=null");
    (home.*setting.set)("from before");
  }
  home.emailPassword("from before");
  ASSERT_TRUE(home.connect(server())) << home.errDescription();
  for (const TextSetting& setting : texts) EXPECT_EQ((home.*setting.get)(), "") << setting.column;
  EXPECT_EQ(home.emailPassword(), "");
  EXPECT_EQ(home.timeOut(), 0);
  EXPECT_EQ(home.smtpPort(), 25);
  EXPECT_EQ(home.smtpAuth(), 0);
  EXPECT_EQ(home.LDPort(), 389);

  for (const char* column : {"AcctDay", "AcctTime"}) {
    store(String(column) + "=null,companyName='Read before'");
    Home failed;
    EXPECT_EQ(refusal(failed, failed.connect(server())), number::type) << column;
    EXPECT_EQ(failed.homeName(), "Read before");
    store(String(column) + "=1");
  }
}

TEST_F(HomeTest, ASaveKeepsANumberThatReadsFalse) {
  store("savePwd=-1,smtpState=3");
  Home home = connected<Home>();
  ASSERT_TRUE(home.Save()) << home.errDescription();
  EXPECT_EQ(stored("savePwd"), "-1");
  EXPECT_EQ(stored("smtpState"), "3");
  home.SavePwd(false);
  ASSERT_TRUE(home.Save());
  EXPECT_EQ(stored("savePwd"), "0");
}

TEST_F(HomeTest, ThePortOfTheDirectoryComesFromTheRowAlone) {
  store("ldEnable=1,LDport=636,LDHost='box'");
  Home home = connected<Home>();
  home.LDPort(3269);
  EXPECT_EQ(home.LDPort(), 636);
  ASSERT_TRUE(home.Save());
  EXPECT_EQ(stored("LDport"), "636");

  store("ldEnable=0");
  home = connected<Home>();
  EXPECT_EQ(home.LDPort(), 389);
  EXPECT_EQ(home.ldHost(), "") << "a directory that is not enabled is not loaded";
  ASSERT_TRUE(home.Save());
  EXPECT_EQ(stored("LDHost"), "") << "and the save writes that";
  EXPECT_EQ(stored("LDport"), "389");
}

TEST_F(HomeTest, AnotherMailServerReadsThePasswordOnlyAfterASave) {
  Home home = connected<Home>();
  home.smtpServer("first");
  home.emailPassword("Mail-Secret");
  ASSERT_TRUE(home.Save());
  store("smtpServer='second'");
  EXPECT_EQ(connected<Home>().emailPassword(), "");
  ASSERT_TRUE(connected<Home>().Save());
  store("smtpServer='first'");
  EXPECT_EQ(connected<Home>().emailPassword(), "Mail-Secret") << "what can't be read is kept by a save";
  home.smtpServer("second ");
  ASSERT_TRUE(home.Save());
  EXPECT_EQ(connected<Home>().emailPassword(), "Mail-Secret") << "read under the name as it is stored";
}

TEST_F(HomeTest, AMissingRowGivesDefaultsAndIsNotMadeByASave) {
  tables_.run("delete from homeinfo");
  Home home;
  home.homeName("left over");
  home.SMIsOpen(true);
  EXPECT_TRUE(home.connect(server(), "QVApp"));
  EXPECT_EQ(home.homeName(), "");
  EXPECT_EQ(home.AcctDay(), 1);
  EXPECT_EQ(home.acctTime(), 1);
  EXPECT_FALSE(home.SMIsOpen());
  EXPECT_TRUE(home.allowSendEmail());
  EXPECT_EQ(home.LDPort(), 389);

  const String root = tables_.text("select deptName from departments where deptNo='_root'");
  home.homeName("New name");
  EXPECT_EQ(refusal(home, home.Save()), number::statement);
  EXPECT_EQ(tables_.text("select count(*) from homeinfo"), "0");
  EXPECT_EQ(tables_.text("select deptName from departments where deptNo='_root'"), root);
}

TEST_F(HomeTest, AFailedSaveLeavesNothing) {
  Home home = connected<Home>();
  home.emailPassword("Mail-Secret");
  home.ldPasswd("abc");
  home.Fax("not stored");
  test::PlainSession(server(), "QVSys").run("drop table departments");
  EXPECT_EQ(refusal(home, home.Save()), number::noTable) << "the root department can't be named";
  EXPECT_NE(stored("fax"), "not stored");

  home = connected<Home>();
  home.homeName("Company");
  home.ldPasswd("z;");
  EXPECT_EQ(refusal(home, home.Save()), number::argument) << "what can't be scrambled is not stored";
  EXPECT_FALSE(Home().Save()) << "not connected";
}

TEST_F(HomeTest, TheCountsOfTheSettingsScreenAreReadAtTheCall) {
  Home home = connected<Home>();
  EXPECT_FALSE(home.hasWorkFlow());
  EXPECT_EQ(home.outerUserNum(), 0);
  tables_.run("insert into ItemGroups (gName) values ('a') insert into ItemGroups (gName) values ('b')");
  tables_.run("update users set isOuter=1 where userId=1");
  tables_.run("insert into cfprocesses (pId,rtUid) values (1,'t1')");
  EXPECT_EQ(home.roleGrpNum(), 2);
  EXPECT_EQ(home.outerUserNum(), 1);
  EXPECT_FALSE(connected<Home>().hasWorkFlow()) << "no template has the process";
  tables_.run("insert into reptmps (rtUid) values ('t1')");
  EXPECT_TRUE(connected<Home>().hasWorkFlow());

  Home nowhere;
  EXPECT_EQ(nowhere.roleGrpNum(), 0);
  EXPECT_NE(nowhere.errNumber(), 0);
}

}  // namespace
}  // namespace QVSa
