#include <algorithm>
#include <chrono>
#include <gtest/gtest.h>

#include "platform/DirectoryLookup.h"
#include "tests/support/Slapd.h"

namespace QVSa::platform {
namespace {

const String people = "ou=people,dc=example,dc=org";
const String ann = "uid=ann," + people;
const String service = "cn=service,dc=example,dc=org";
const String annLine = ann + "\tann\tAnn Example\tann@example.org\n";
const String bobLine = "uid=bob," + people + "\tbob\tBob (Sales) *\\\t\n";

class DirectoryLookupTest : public ::testing::Test {
 protected:
  void SetUp() override {
    QVSA_NEEDS_SLAPD();
    if (!slapd_) slapd_ = std::make_unique<test::Slapd>();
    query_.host = "127.0.0.1";
    query_.port = slapd_->port();
    query_.bindDn = service;
    query_.searchText = people;
  }
  static void TearDownTestSuite() { slapd_.reset(); }

  String find(const String& searchText, const String& password = "Reader-7") {
    query_.searchText = searchText;
    return getUsersFromLD(query_, password, status_);
  }

  static inline std::unique_ptr<test::Slapd> slapd_;
  DirectoryQuery query_;
  Integer status_ = -1;
};

TEST_F(DirectoryLookupTest, TheUsersBelowANameComeOneALine) {
  EXPECT_EQ(find(people), annLine + bobLine);
  EXPECT_EQ(status_, directoryDone);
  EXPECT_EQ(find(ann), annLine);
  const String many = find("ou=many,dc=example,dc=org");
  EXPECT_EQ(std::count(many.begin(), many.end(), '\n'), test::Slapd::many) << "page by page";
  EXPECT_EQ(find("ou=empty,dc=example,dc=org"), "");
  EXPECT_EQ(status_, directoryDone) << "nobody there is no failure";
  EXPECT_EQ(find("uid=nobody," + people), "");
  EXPECT_EQ(status_, directoryFailed);
}

TEST_F(DirectoryLookupTest, ATextThatIsNoNameIsLookedUpLiterally) {
  EXPECT_EQ(find("ANN"), annLine);
  EXPECT_EQ(find("ann@example.org"), annLine);
  EXPECT_EQ(find("Bob (Sales) *\\"), bobLine);
  EXPECT_EQ(find("*"), "") << "no pattern";
  EXPECT_EQ(find("ann)(uid>a"), "");
  EXPECT_EQ(status_, directoryDone);
}

TEST_F(DirectoryLookupTest, AWindowsDirectoryIsReadByItsOwnNames) {
  const String windows = "ou=windows,dc=example,dc=org";
  const String carlLine = "cn=Carl," + windows + "\tcarl\tCarl\t\n";
  const String doraLine = "cn=Dora," + windows + "\tdora@corp\tDora\t\n";
  EXPECT_EQ(find(windows), carlLine + doraLine) << "a computer is no person";
  EXPECT_EQ(find("CARL"), carlLine);
  EXPECT_EQ(find("carl@corp"), carlLine);
}

TEST_F(DirectoryLookupTest, ABindNeedsTheRightNameAndPassword) {
  query_.bindDn = ann;
  EXPECT_EQ(find(ann, "Secret-1"), annLine);
  for (const char* password : {"wrong", "secret-1", ""}) {
    EXPECT_EQ(find(ann, password), "");
    EXPECT_EQ(status_, directoryRefused) << password;
  }
  query_.bindDn = "uid=nobody," + people;
  EXPECT_EQ(find(ann, "Secret-1"), "");
  EXPECT_EQ(status_, directoryRefused);
  query_.bindDn = "no name";
  EXPECT_EQ(find(ann, "Secret-1"), "");
  EXPECT_EQ(status_, directoryRefused);
  query_.bindDn = "";
  EXPECT_EQ(find(ann, ""), "") << "nobody may read nothing";
  EXPECT_EQ(status_, directoryFailed);
}

TEST_F(DirectoryLookupTest, TlsIsSpokenAndTheCertificateIsChecked) {
  query_.security = DirectoryQuery::Security::startTls;
  EXPECT_EQ(find(ann), annLine);
  query_.host = "localhost";
  EXPECT_EQ(find(ann), "") << "a certificate for another name";
  EXPECT_EQ(status_, directoryUnreachable);

  query_.host = "127.0.0.1";
  query_.port = slapd_->tlsPort();
  query_.security = DirectoryQuery::Security::tls;
  EXPECT_EQ(find(ann), annLine);
  query_.security = DirectoryQuery::Security::byPort;
  EXPECT_EQ(find(ann), "") << "plain text to a port that speaks TLS";
  EXPECT_EQ(status_, directoryUnreachable);
}

TEST_F(DirectoryLookupTest, AServerThatHangsOrIsGoneIsUnreachable) {
  using Security = DirectoryQuery::Security;
  query_.seconds = 1;
  slapd_->hang();
  for (const Security security : {Security::byPort, Security::startTls, Security::tls}) {
    query_.security = security;
    query_.port = security == Security::tls ? slapd_->tlsPort() : slapd_->port();
    status_ = directoryDone;
    const auto start = std::chrono::steady_clock::now();
    EXPECT_EQ(find(people), "");
    EXPECT_EQ(status_, directoryUnreachable);
    EXPECT_LT(std::chrono::steady_clock::now() - start, std::chrono::seconds(10));
  }
  slapd_->goOn();
  query_.seconds = 10;
  EXPECT_EQ(find(ann), annLine);

  slapd_->stop();
  EXPECT_EQ(find(people), "");
  EXPECT_EQ(status_, directoryUnreachable);
  slapd_.reset();
  query_.host = "";
  EXPECT_EQ(find(people), "");
  EXPECT_EQ(status_, directoryUnreachable) << "no host is not the one of the system's settings";
}

}  // namespace
}  // namespace QVSa::platform
