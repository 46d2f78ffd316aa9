#include <gtest/gtest.h>

#include "QVSa/QVSa.h"
#include "QVSa/resources/Messages.h"
#include "tests/support/RecordingProvider.h"
#include "tests/support/Scene.h"

namespace QVSa {
namespace {

class RegistrationTest : public test::Scene {
 protected:
  RegistrationTest() {
    tables_.run("update users set email='admin@example.org' where userLogin='Admin'");
    Home home = connected<Home>();
    home.allowSMTP(true);
    home.allowSendEmail(true);
    home.emailSubject("Your application");
    home.emailPContent("Welcome.");
    home.emailRContent("Sorry.");
    EXPECT_TRUE(home.Save()) << home.errDescription();
  }

  User applicant(const String& login = "ann") {
    auto user = connected<User>();
    user.Name("Ann");
    user.Login(login);
    user.Pwd("right");
    user.Email(login + "@example.org");
    user.company("Theirs");
    return user;
  }
  String mails() { return tables_.text("select emType,emTo,emSubject,emBody from QVMailQ order by emId"); }
  Long failedSignOn(const String& login = "ann") {
    auto user = connected<User>();
    String session;
    return user.loginAuth(login, "right", &session) ? 0 : user.errNumber();
  }
};

TEST_F(RegistrationTest, AnApplicantWaitsForTheAuditAndThenSignsOn) {
  User ann = applicant();
  ann.MobilePhone("1");
  ann.telePhone("2");
  ann.Address("3");
  ann.zipcode("4");
  ASSERT_TRUE(ann.Reg("Sales", "Please ")) << ann.errDescription();
  EXPECT_EQ(tables_.text("select d.deptNo,u.uType,u.accstate,u.company,u.isOuter from users u,departments d"
                         " where u.deptId=d.deptId and u.userLogin='ann'"),
            "_root|2|2|Sales|0");
  EXPECT_EQ(tables_.text("select isOuter,submitTime,Company,deptName,Email,telephone,MobilePhone,address,zipcode,"
                         "userDesc,checkTime from QVUserRegInfo where UserId=" +
                         text(ann.Id())),
            "0|2024-03-07 10:00:00|Sales|Sales|ann@example.org|2|1|3|4|Please|-");
  EXPECT_EQ(mails(), "1|admin@example.org|Tabulon -- account application from [Sales] - [Ann]|Sales - Ann\r\nPlease");
  EXPECT_EQ(failedSignOn(), messageNumber(1118));

  clock_.set(Date(2024, 3, 8, 9, 30, 0));
  User loaded = this->loaded("ann");
  ASSERT_TRUE(loaded.regAudit(false, "No <userId>")) << loaded.errDescription();
  EXPECT_EQ(tables_.text("select u.accstate,r.checkTime,r.noPassReason from users u,QVUserRegInfo r"
                         " where u.userId=r.UserId"),
            "3|2024-03-08 09:30:00|No <userId>");
  for (const Long state : {3, 2}) {
    tables_.run("update users set accstate=" + text(state) + " where userLogin='ann'");
    EXPECT_TRUE(this->loaded("ann").Save(true));
    EXPECT_EQ(failedSignOn(), messageNumber(1118)) << "a save is no audit";
  }

  ASSERT_TRUE(loaded.regAudit(true));
  EXPECT_EQ(failedSignOn(), 0);
  EXPECT_EQ(tables_.rows("select emTo,emSubject,emBody from QVMailQ where emTo='ann@example.org' order by emId"),
            (test::Lines{"ann@example.org|Your application|Sorry.\r\nNo <userId>",
                         "ann@example.org|Your application|Welcome.\r\n"}));
}

TEST_F(RegistrationTest, AnOutsideApplicantKeepsHisCompanyAndGoesToTheOutside) {
  User ann = applicant();
  ann.isOuter(true);
  ASSERT_TRUE(ann.Reg("Sales")) << ann.errDescription();
  EXPECT_EQ(tables_.text("select d.deptNo,u.company,r.isOuter,r.Company,r.deptName"
                         " from users u,departments d,QVUserRegInfo r"
                         " where u.deptId=d.deptId and u.userId=r.UserId"),
            "_out|Theirs|1|Theirs|Sales");
}

TEST_F(RegistrationTest, ARefusedApplicationLeavesNothing) {
  savePolicy([](safeRule& rule) { rule.minLen(8); });
  User ann = applicant();
  EXPECT_EQ(refusal(ann, ann.Reg()), messageNumber(3000));
  savePolicy([](safeRule& rule) { rule.minLen(0); });
  ann.Name("");
  EXPECT_EQ(refusal(ann, ann.Reg()), messageNumber(1102));
  User second = applicant("Admin");
  EXPECT_EQ(refusal(second, second.Reg()), number::integrity) << "the login is taken";
  test::RecordingProvider recorder;
  recorder.beforeEach([&](const String& event) {
    if (event.starts_with("select * from QVUserRegInfo")) tables_.run("delete from QVUserRegInfo");
  });
  User lost = applicant();
  EXPECT_EQ(refusal(lost, lost.Reg()), messageNumber(1130)) << "without the row of extra data he is deleted again";
  EXPECT_EQ(tables_.text("select count(*) from users"), "1");
  EXPECT_EQ(tables_.text("select count(*) from QVUserRegInfo"), "0");
  EXPECT_EQ(mails(), "");
}

TEST_F(RegistrationTest, NoMailGoesWhereTheSettingsOrTheAddressSayNo) {
  tables_.run("update users set email='' where userLogin='Admin'");
  EXPECT_TRUE(applicant("one").Reg());
  tables_.run("update users set email='admin@example.org' where userLogin='Admin'");
  tables_.run("update homeinfo set smtpState=0,allowSendEmail=0");
  User two = applicant("two");
  two.Name("Two");
  EXPECT_TRUE(two.Reg());
  EXPECT_TRUE(two.regAudit(true));
  EXPECT_EQ(two.errNumber(), 0);
  tables_.run("update homeinfo set smtpState=1,allowSendEmail=1,AcctDay=null");
  for (const bool isAudit : {false, true}) {
    User unread = applicant("unread");
    EXPECT_TRUE(isAudit ? unread.regAudit(true, "", two.Id()) : unread.Reg());
    EXPECT_EQ(unread.errNumber(), number::type) << "the settings can't be read";
  }
  tables_.run("delete from homeinfo");
  User three = applicant("three");
  EXPECT_TRUE(three.Reg()) << "without settings there is no mail server";
  EXPECT_EQ(mails(), "");
  EXPECT_TRUE(three.regAudit(true)) << "but letters are allowed by default";
  EXPECT_EQ(mails(), "1|three@example.org||\r\n");
}

TEST_F(RegistrationTest, AnAuditTakesAnyUserAndWritesToTheOneThatIsLoaded) {
  addUser("bob");
  User ann = applicant();
  ASSERT_TRUE(ann.Reg());
  EXPECT_TRUE(ann.regAudit(false, "", loaded("bob").Id()));
  EXPECT_EQ(loaded("bob").regState(), 3);
  EXPECT_EQ(loaded("ann").regState(), 2);
  EXPECT_EQ(tables_.text("select emTo from QVMailQ where emSubject='Your application'"), "ann@example.org");
}

}  // namespace
}  // namespace QVSa
