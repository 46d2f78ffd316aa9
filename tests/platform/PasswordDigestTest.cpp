#include <gtest/gtest.h>
#include <set>

#include "platform/PasswordDigest.h"

namespace QVSa::platform {
namespace {

TEST(PasswordDigest, MatchesItsPasswordAlone) {
  const String digest = makePasswordDigest("p\u00e4ss");
  EXPECT_EQ(digest.find("pbkdf2-sha256$20000$"), 0U);
  EXPECT_TRUE(passwordMatches("p\u00e4ss", digest));
  EXPECT_FALSE(passwordMatches("P\u00e4ss", digest));
  EXPECT_FALSE(passwordMatches("", digest));
  EXPECT_NE(makePasswordDigest("p\u00e4ss"), digest);
  EXPECT_TRUE(passwordMatches("", makePasswordDigest("")));
}

TEST(PasswordDigest, IsTheStandardOne) {
  EXPECT_TRUE(passwordMatches(
      "password", "pbkdf2-sha256$1$73616c74$120fb6cffcf8b32c43e7225256c4f837a86548c92ccc35480805987cb70be17b"));
}

TEST(PasswordDigest, OfAnotherFormMatchesNothing) {
  const String digest = "120fb6cffcf8b32c43e7225256c4f837a86548c92ccc35480805987cb70be17b";
  for (const String& text :
       {String(), String("password"), "pbkdf2-sha1$1$73616c74$" + digest, "pbkdf2-sha256$0$73616c74$" + digest,
        "pbkdf2-sha256$1x$73616c74$" + digest, "pbkdf2-sha256$99999999999$73616c74$" + digest,
        "pbkdf2-sha256$1$73616c7$" + digest, "pbkdf2-sha256$1$73616c74$" + digest.substr(2),
        "pbkdf2-sha256$1$73616c74$" + digest + "$", String("pbkdf2-sha256$1$73616c74"), String("pbkdf2-sha256$1$$")}) {
    EXPECT_FALSE(passwordMatches("password", text)) << text;
  }
}

TEST(MadePassword, IsTwentyLettersAndDigitsThatLookDifferent) {
  std::set<char> seen;
  std::set<String> passwords;
  for (int i = 0; i < 300; ++i) {
    const String password = makePassword();
    EXPECT_EQ(password.size(), 20U);
    seen.insert(password.begin(), password.end());
    passwords.insert(password);
  }
  EXPECT_EQ(passwords.size(), 300U);
  EXPECT_EQ(seen.size(), 56U);
  for (const char c : String("0O1lIo;|'\"")) EXPECT_FALSE(seen.contains(c)) << c;
}

}  // namespace
}  // namespace QVSa::platform
