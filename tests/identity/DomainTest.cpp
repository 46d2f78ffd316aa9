#include <gtest/gtest.h>

#include "QVSa/QVSa.h"
#include "tests/support/Scene.h"
#include "tests/support/Slapd.h"

namespace QVSa {
namespace {

// Accounts that others vouch for, through the real exchange and a real directory.
class DomainTest : public test::Scene {
 protected:
  void addWindowsUser(const String& login, const String& domain) {
    addUser(login, [&](User& user) {
      user.uType(adUser);
      user.Domain(domain);
    });
  }
  void addDirectoryUser(const String& login, const String& dn) {
    addUser(login, [&](User& user) {
      user.uType(ldapUser);
      user.dn(dn);
    });
  }
  void useDirectory(const test::Slapd& slapd) {
    tables_.run("update homeinfo set LDport=" + text(slapd.port()) + ",ldEnable=1");
    Home home = connected<Home>();
    home.ldHost("127.0.0.1");
    home.ldBindDN("cn=service,dc=example,dc=org");
    home.ldPasswd("Reader-7");
    home.ldBaseDN("ou=people,dc=example,dc=org");
    ASSERT_TRUE(home.Save()) << home.errDescription();
  }
  // 0 for a session.
  Long signOn(const String& login, const String& password, Boolean authLd = false) {
    auto user = connected<User>();
    String session;
    const Boolean done = user.loginAuth(login, password, &session, authLd);
    EXPECT_EQ(done, !session.empty());
    return done ? 0 : user.errNumber();
  }
  String failures(const String& login) {
    return tables_.text("select lgts from users where userLogin='" + login + "'");
  }
};

TEST_F(DomainTest, AWindowsUserSignsOnWithThePasswordOfHisDomain) {
  addWindowsUser("ann", "CORP");
  EXPECT_EQ(signOn("ann", "Secret-1"), 0);
  EXPECT_EQ(signOn("ann", "right"), messageNumber(1123)) << "the stored one is of no account";
}

TEST_F(DomainTest, FailuresOfAWindowsUserAreCountedAndLock) {
  savePolicy([](safeRule& rule) {
    rule.lockErr(true);
    rule.errTimes(3);
  });
  addWindowsUser("ann", "CORP");
  EXPECT_EQ(signOn("ann", ""), messageNumber(1123));
  EXPECT_EQ(failures("ann"), "1");
  EXPECT_EQ(signOn("ann", "Secret-1"), 0);
  EXPECT_EQ(failures("ann"), "0");
  for (int i = 0; i < 2; ++i) EXPECT_EQ(signOn("ann", "wrong"), messageNumber(1123));
  EXPECT_EQ(signOn("ann", "wrong"), messageNumber(1118));
  EXPECT_EQ(signOn("ann", "Secret-1"), messageNumber(1118));

  addWindowsUser("bert", "OTHER");
  EXPECT_EQ(signOn("bert", "Bert-\xC3\x84-1"), messageNumber(1123)) << "another domain";
}

TEST_F(DomainTest, ADirectoryUserBindsWithHisOwnPassword) {
  QVSA_NEEDS_SLAPD();
  const test::Slapd slapd;
  addDirectoryUser("ann", "uid=ann,ou=people,dc=example,dc=org");
  EXPECT_EQ(signOn("ann", "Secret-1"), messageNumber(1131)) << "the directory is not enabled";
  useDirectory(slapd);
  EXPECT_EQ(signOn("ann", "Secret-1"), 0);
  for (const char* password : {"wrong", "right", ""}) EXPECT_EQ(signOn("ann", password), messageNumber(1131));
  EXPECT_EQ(failures("ann"), "0");
}

TEST_F(DomainTest, TheServiceAccountOnlyHasToFindAUser) {
  QVSA_NEEDS_SLAPD();
  test::Slapd slapd;
  useDirectory(slapd);
  addDirectoryUser("ann", "uid=ann,ou=people,dc=example,dc=org");
  addDirectoryUser("gone", "uid=gone,ou=people,dc=example,dc=org");
  EXPECT_EQ(signOn("ann", "wrong", true), 0);
  EXPECT_EQ(signOn("gone", "wrong", true), messageNumber(1131));

  Home home = connected<Home>();
  String items;
  EXPECT_EQ(home.getUsersFromLDS(items), 0);
  EXPECT_EQ(items.substr(0, items.find('\n')),
            "uid=ann,ou=people,dc=example,dc=org\tann\tAnn Example\tann@example.org");
  home.ldPasswd("wrong");
  EXPECT_EQ(home.getUsersFromLDS(items), 2);
  EXPECT_EQ(items, "");
  slapd.stop();
  EXPECT_EQ(signOn("ann", "wrong", true), messageNumber(1131));
  EXPECT_EQ(home.getUsersFromLDS(items), 1);
}

}  // namespace
}  // namespace QVSa
