#include "tests/console/Program.h"
#include "tests/support/Slapd.h"

namespace QVSa::console {
namespace {

using test::Outcome;

class SettingsProgram : public test::Program {
 protected:
  Json settings() { return run("settings show").document; }
  String file(const char* name, const String& content) {
    const auto path = folder_.path() / name;
    std::ofstream(path) << content;
    return "'" + path.string() + "'";
  }
};

TEST_F(SettingsProgram, WhatIsNotNamedStaysPicturesAndSecretsToo) {
  ASSERT_EQ(run("settings set --name 'Our Co' --login-title Hello --login-news http://x --mail --mail-server smtp "
                "--mail-password "
                "--directory --directory-host box --directory-port 636 --directory-password",
                "Mail-Secret\nabc\n")
                .exitCode,
            0);
  ASSERT_EQ(run("settings pictures set --login-image " + file("picture", "a picture")).exitCode, 0);
  const String secrets = value("select emailPassword+LDPasswd from homeinfo");
  const Outcome changed = run("settings set --fax 12 --no-outside-users");
  EXPECT_EQ(changed.exitCode, 0) << changed.said;

  const Json after = settings();
  EXPECT_EQ(after["name"], "Our Co");
  EXPECT_EQ(after["fax"], "12");
  EXPECT_EQ(after["login-title"], "Hello");
  EXPECT_EQ(after["login-news"], "http://x");
  EXPECT_EQ(after["mail"], true);
  EXPECT_EQ(after["directory-port"], 636);
  EXPECT_EQ(after["login-image"], true);
  EXPECT_EQ(value("select LDPasswd from homeinfo"), secrets.substr(secrets.size() - 8));
  for (const String& secret : {String("Mail-Secret"), String("abc"), secrets.substr(secrets.size() - 8)})
    EXPECT_EQ((after.dump() + changed.document.dump() + changed.said).find(secret), String::npos) << secret;

  std::filesystem::create_directory(folder_.path() / "here");
  const Json fetched = run("settings pictures fetch '" + (folder_.path() / "here").string() + "'").document;
  EXPECT_EQ(fetched["login-image"], (folder_.path() / "here" / "LoginImage").string());
  EXPECT_EQ(run("settings pictures set --no-login-image").document["login-image"], false);
  EXPECT_EQ(run("settings pictures set --icon '/no such file'").exitCode, 1);
}

TEST_F(SettingsProgram, SettingsOfADirectoryThatIsOffAreRefused) {
  EXPECT_EQ(run("settings set --directory-host box").exitCode, 2);
  const Outcome refused = run("settings set --directory --directory-password", "z;\n");
  EXPECT_EQ(refused.exitCode, 1);
  EXPECT_EQ(refused.error(), "5");
  EXPECT_EQ(settings()["directory"], false) << "nothing of a refused change is stored";
}

TEST_F(SettingsProgram, AnApplicantIsAudited) {
  ASSERT_EQ(run("register ann Ann --unit Sales --email ann@x --remark please", "Ann-pass-1\n").exitCode, 0);
  EXPECT_EQ(run("sign-on ann", "Ann-pass-1\n").error(), "0x8004045E");
  EXPECT_EQ(run("audit ann").exitCode, 2);
  EXPECT_EQ(run("audit ann --refuse --remark no").exitCode, 0);
  EXPECT_EQ(run("audit ann --accept").exitCode, 1) << "it waits no longer";
  ASSERT_EQ(run("register bob Bob", "Bob-pass-1\n").exitCode, 0);
  EXPECT_EQ(run("audit bob --accept").exitCode, 0);
  EXPECT_EQ(run("sign-on bob", "Bob-pass-1\n").exitCode, 0);
  EXPECT_EQ(run("audit Admin --refuse").exitCode, 1);
}

TEST_F(SettingsProgram, UsersOfTheDirectoryAreListed) {
  EXPECT_EQ(run("directory users").error(), "3");
  QVSA_NEEDS_SLAPD();
  const test::Slapd slapd;
  const String where = "settings set --directory --directory-host 127.0.0.1 --directory-port " +
                       std::to_string(slapd.port()) + " --directory-base ou=people,dc=example,dc=org";
  ASSERT_EQ(run(where + " --directory-bind cn=service,dc=example,dc=org --directory-password", "Reader-7\n").exitCode,
            0);
  const Json users = run("directory users").document;
  ASSERT_EQ(users.size(), 2U);
  EXPECT_EQ(users[0]["login"], "ann");
  EXPECT_EQ(users[0]["email"], "ann@example.org");
  ASSERT_EQ(run("settings set --directory-password", "abc\n").exitCode, 0);
  EXPECT_EQ(run("directory users").error(), "2");
}

}  // namespace
}  // namespace QVSa::console
