#include "QVSa/frame/Secrets.h"
#include "QVSa/hosting/SecretRotation.h"
#include "platform/PrivateFile.h"
#include "platform/SecretMessage.h"
#include "tests/support/Scene.h"

namespace QVSa {
namespace {

class ARotation : public test::Scene {
 protected:
  ARotation() {
    platform::makePrivateFile(file_, Secrets::madeUp().fileText());
    rotation_.connect(server());
    const Secrets& old = deploymentSecrets();
    store("update QVTmpSafe set protectPwd=", "Sesame", old.templatePwdKey);
    store("update roles set roleSpec=", "7.9|lock", old.backupLockKey(), " where roleId=4");
    store("insert into repTmps(rtUid,rtPwd) select 'own',", "Mine", old.templatePwdKey);
    store("insert into repTmps(rtUid,rtPwd) select 'default',", old.defaultTemplatePwd, old.templatePwdKey);
    run("insert into repTmps(rtUid,rtPwd) values('broken','?')");
  }

  // By the log-in sa, whose password stays.
  Connection administrator() {
    Connection connection;
    connection.Open(installation_.administratorString("QVSys"));
    return connection;
  }
  void run(const String& batch) { administrator().Execute(batch); }
  String text(const String& query) {
    Connection connection = administrator();
    return connection.Execute(query)[0].asText();
  }

  void store(const String& statement, const String& text, const String& key, const String& rest = "") {
    run(statement + "'" + platform::encryptText(text, key) + "'" + rest);
  }

  // What a process with these secrets reads.
  String read(const Secrets& secrets) {
    String result;
    for (const char* query : {"select protectPwd from QVTmpSafe", "select rtPwd from repTmps where rtUid='own'",
                              "select rtPwd from repTmps where rtUid='default'"})
      result += platform::decryptText(text(query), secrets.templatePwdKey) + " ";
    return result + platform::decryptText(text("select roleSpec from roles where roleId=4"), secrets.backupLockKey());
  }

  test::TestFolder folder_;
  const String file_ = (folder_.path() / "secrets").string();
  SecretRotation rotation_;
};

TEST_F(ARotation, MovesTheLogInAndEveryTextThatItCanReadWholeOrNotAtAll) {
  const Secrets& old = deploymentSecrets();
  const Secrets fresh = Secrets::ofFile(file_);
  const String administrator = test::TestInstallation::administratorPassword;
  const String before = "Sesame Mine " + old.defaultTemplatePwd + " 7.9|lock";

  EXPECT_FALSE(rotation_.rotate(file_, "wrong"));
  EXPECT_EQ(rotation_.errNumber(), number::login);
  run("drop login QVUser");
  EXPECT_FALSE(rotation_.rotate(file_, administrator)) << "the last step fails";
  run("create login QVUser with password=N'" + old.loginPassword() + "'");
  EXPECT_EQ(read(old), before);

  ASSERT_TRUE(rotation_.rotate(file_, administrator)) << rotation_.errDescription();
  EXPECT_EQ(rotation_.moved(), 4);
  EXPECT_EQ(rotation_.unread(), std::vector<String>{"the template broken"});
  EXPECT_EQ(read(fresh), "Sesame Mine " + fresh.defaultTemplatePwd + " 7.9|lock");
  EXPECT_EQ(text("select rtPwd from repTmps where rtUid='broken'"), "?");
  EXPECT_THROW(Connection().Open(buildConnString(server(), "QVApp", false)), Failure);
  EXPECT_FALSE(rotation_.rotate(file_, administrator));
  EXPECT_EQ(rotation_.errNumber(), number::argument) << "a second time it would find nothing that it can read";

  store("update QVTmpSafe set protectPwd=", "Sesame", old.templatePwdKey);
  run("update roles set roleSpec=null where roleId=4");
  EXPECT_TRUE(rotation_.rotateTexts(file_, administrator));
  EXPECT_EQ(rotation_.moved(), 1) << "what an older backup brought back";
  EXPECT_EQ(text("select count(*) from roles where roleId=4 and roleSpec is null"), "1") << "nothing to move";
}

}  // namespace
}  // namespace QVSa
