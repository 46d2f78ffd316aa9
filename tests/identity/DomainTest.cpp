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
};

TEST_F(DomainTest, AWindowsUserSignsOnWithThePasswordOfHisDomain) {
  savePolicy([](safeRule& rule) { rule.maxDay(1); });
  addWindowsUser("ann", "CORP");
  clock_.set(Date(2024, 5, 1));
  EXPECT_EQ(signOn("ann", "Secret-1"), 0) << "it never expires";
  EXPECT_EQ(signOn("ann", "right"), messageNumber(1123)) << "the stored one is of no account";
}

TEST_F(DomainTest, ADirectoryUserBindsWithHisOwnPassword) {
  QVSA_NEEDS_SLAPD();
  const test::Slapd slapd;
  addDirectoryUser("ann", "uid=ann,ou=people,dc=example,dc=org");
  EXPECT_EQ(signOn("ann", "Secret-1"), messageNumber(1131)) << "the directory is not enabled";
  useDirectory(slapd);
  EXPECT_EQ(signOn("ann", "Secret-1"), 0);
  for (const char* password : {"wrong", "right", ""}) EXPECT_EQ(signOn("ann", password), messageNumber(1131));
  EXPECT_EQ(tables_.text("select lgts from users where userLogin='ann'"), "0") << "nothing is counted";
}

TEST_F(DomainTest, ADirectoryIsAskedByTheUserOrByTheServiceAccountAndNeverByNobody) {
  std::vector<String> asked;
  replace(&platform::Services::getUsersFromLD, {[&](const platform::DirectoryQuery& query, const String& password,
                                                    Integer&) {
    asked.push_back(query.host + ":" + text(query.port) + " " + query.bindDn + " " + password + " " + query.searchText);
    return String("somebody");
  }});
  addDirectoryUser("ann", "cn=ann");
  addDirectoryUser("bare", "");
  tables_.run("update homeinfo set ldHost='box',LDport=636,ldBindDN='cn=service',ldPasswd='" + scrambleText("abc") +
              "',ldEnable=1");
  EXPECT_EQ(signOn("ann", "theirs"), 0);
  EXPECT_EQ(signOn("bare", "theirs", true), 0);
  EXPECT_EQ(asked, (std::vector<String>{"box:636 cn=ann theirs cn=ann", "box:636 cn=service abc cn=service"}));
  EXPECT_EQ(signOn("ann", ""), messageNumber(1131)) << "a bind without a password proves nothing";
  EXPECT_EQ(signOn("bare", "theirs"), messageNumber(1131)) << "nor does one without a name";
  EXPECT_EQ(asked.size(), 2U);
}

}  // namespace
}  // namespace QVSa
