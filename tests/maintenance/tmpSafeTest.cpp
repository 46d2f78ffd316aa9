#include "QVSa/frame/DeploymentSecrets.h"
#include "QVSa/maintenance/tmpSafe.h"
#include "platform/SecretMessage.h"
#include "tests/support/Scene.h"

namespace QVSa {
namespace {

class TemplateSafe : public test::Scene {
 protected:
  TemplateSafe() {
    tables_.run("insert into seslog(sesId,userLogin) values('s1','Admin')");
    addTemplate("default", secrets::defaultTemplatePwd);
    addTemplate("own", "Mine");
    addTemplate("small", "hobart");
    tables_.run(
        "insert into repTmps(rtUid,rtPwd) values('none',null) insert into repTmps(rtUid,rtPwd) values('x-broken','?')");
  }

  void addTemplate(const String& id, const String& password) const {
    tables_.run("insert into repTmps(rtUid,rtPwd) values('" + id + "','" +
                platform::encryptText(password, secrets::templatePwdKey) + "')");
  }

  // Templates with a password.
  String locked() const { return tables_.text("select rtUid from repTmps where rtPwd<>'' order by rtUid"); }

  // What a fresh object gives to session s1.
  String stored() const {
    tmpSafe safe;
    String password = "?";
    EXPECT_TRUE(safe.connect(server(), "QVApp") && safe.getPwd("s1", password)) << safe.errDesc();
    return password;
  }

  tmpSafe safe_;
};

TEST_F(TemplateSafe, TheFirstPasswordFreesTheTemplatesWithTheDefaultOne) {
  ASSERT_TRUE(safe_.connect(server()));
  EXPECT_EQ(stored(), "");
  safe_.protectPwd("Secret 1");
  EXPECT_TRUE(safe_.Save()) << safe_.errDesc();
  EXPECT_EQ(stored(), "Secret 1");
  EXPECT_EQ(tables_.text("select count(*) from QVTmpSafe where protectPwd like '%Secret%'"), "0");
  EXPECT_EQ(locked(), "own\nsmall\nx-broken");

  // The same object saves for the first time again; one that has read the password does not.
  addTemplate("later", secrets::defaultTemplatePwd);
  EXPECT_TRUE(safe_.Save());
  EXPECT_EQ(locked(), "own\nsmall\nx-broken");
  addTemplate("last", secrets::defaultTemplatePwd);
  tmpSafe second;
  second.connect(server());
  second.protectPwd("Secret 2");
  EXPECT_TRUE(second.Save());
  EXPECT_EQ(locked(), "last\nown\nsmall\nx-broken");
  EXPECT_EQ(stored(), "Secret 2");

  // Without a row both passwords stay as they were.
  tables_.run("delete from QVTmpSafe");
  String password;
  EXPECT_TRUE(second.connect(server()) && second.Save() && second.getPwd("s1", password));
  EXPECT_EQ(password, "Secret 2");
  EXPECT_EQ(locked(), "last\nown\nsmall\nx-broken");
}

TEST_F(TemplateSafe, AChangeOfAllLeavesNoTemplateAPassword) {
  safe_.connect(server(), "QVApp");
  EXPECT_TRUE(safe_.Save(true));
  EXPECT_EQ(locked(), "");
}

TEST_F(TemplateSafe, OnlyALiveSessionReadsThePassword) {
  safe_.connect(server());
  safe_.protectPwd("Secret 1");
  String password = "before";
  EXPECT_TRUE(safe_.getPwd("S1", password)) << "read before it is saved, by an id of another case";
  EXPECT_EQ(password, "Secret 1");
  EXPECT_FALSE(safe_.getPwd("s2", password));
  EXPECT_EQ(password, "");
  EXPECT_EQ(safe_.errNumber(), static_cast<Long>(0x80048215));
  EXPECT_EQ(safe_.errDesc(), "Illegal reading operation");
}

TEST_F(TemplateSafe, APasswordOfAnotherKeyIsGivenToNobodyAndKept) {
  tables_.run("update QVTmpSafe set protectPwd='of another key'");
  String password = "before";
  EXPECT_TRUE(safe_.connect(server()) && safe_.Save());
  EXPECT_FALSE(safe_.getPwd("s1", password));
  EXPECT_EQ(password, "");
  EXPECT_EQ(locked(), "default\nown\nsmall\nx-broken") << "it is not the first one";
  EXPECT_EQ(tables_.text("select protectPwd from QVTmpSafe"), "of another key");
}

}  // namespace
}  // namespace QVSa
