#include <cstdlib>
#include <map>

#include "QVSa/identity/User.h"
#include "QVSa/settings/MachineSettings.h"
#include "platform/Files.h"
#include "tests/support/SettingsScene.h"

namespace QVSa {
namespace {

using Security = platform::DirectoryQuery::Security;

// The real store, in a folder of its own.
class MachineSettingsTest : public test::SettingsScene {
 protected:
  MachineSettingsTest() {
    replace(&platform::Services::openSettings, {platform::openSettings});
    setenv("QVSA_SETTINGS", root_.path().c_str(), 1);
  }
  ~MachineSettingsTest() override { unsetenv("QVSA_SETTINGS"); }

  void makeKey() { std::filesystem::create_directories(root_.path() / "Software/Morvane/Tabulon"); }
  std::optional<String> value(const char* name) { return platform::openSettings(machineSettingsKey)->value(name); }
  void fetch() {
    Home home;
    ASSERT_TRUE(home.getImage(server())) << home.errDescription();
  }

  test::TestFolder root_;
};

TEST_F(MachineSettingsTest, TheTextsOfTheLoginScreenReachTheStore) {
  makeKey();
  store("LoginNewsUrl='http://news',loginTitle=N'Gr\xC3\xBC\xC3\x9F Gott'");
  fetch();
  EXPECT_EQ(value("LoginNewsUrl"), "http://news");
  EXPECT_EQ(value("loginTitle"), "Gr\xC3\xBC\xC3\x9F Gott");
  store("LoginNewsUrl='',loginTitle=null");
  fetch();
  EXPECT_EQ(value("LoginNewsUrl"), std::nullopt) << "an empty text is deleted, not stored";
  EXPECT_EQ(value("loginTitle"), std::nullopt);
}

TEST_F(MachineSettingsTest, AMachineWithoutTheKeyIsLeftAlone) {
  store("LoginNewsUrl='http://news'");
  fetch();
  EXPECT_TRUE(std::filesystem::is_empty(root_.path()));
  EXPECT_EQ(platform::openSettings("..\\" + root_.path().filename().string()), nullptr) << "out of it and in again";
}

TEST_F(MachineSettingsTest, TheStoreTellsHowToSpeakToTheDirectory) {
  EXPECT_EQ(directorySecurity(), Security::byPort) << "no key";
  makeKey();
  EXPECT_EQ(directorySecurity(), Security::byPort);
  const auto key = platform::openSettings(machineSettingsKey);
  const std::map<String, std::optional<Security>> meanings = {
      {"tls", Security::tls},   {"startTls", Security::startTls}, {" starttls\r\n", Security::startTls},
      {"\n", Security::byPort}, {"start Tls", std::nullopt},      {"x", std::nullopt}};
  for (const auto& [text, meaning] : meanings) {
    EXPECT_TRUE(key->write("directorySecurity", text));
    EXPECT_EQ(directorySecurity(), meaning) << text;
  }
  EXPECT_TRUE(key->remove("directorySecurity"));
  EXPECT_TRUE(key->remove("directorySecurity")) << "there was none";
  EXPECT_EQ(directorySecurity(), Security::byPort);
}

TEST_F(MachineSettingsTest, ADirectoryIsNotAskedWhereItIsNotKnownHow) {
  makeKey();
  std::filesystem::create_directory(root_.path() / "Software/Morvane/Tabulon/directorySecurity");
  EXPECT_EQ(directorySecurity(), std::nullopt) << "there, and no text";
  int asked = 0;
  replace(&platform::Services::getUsersFromLD, {[&](const auto&, const String&, Integer&) {
    ++asked;
    return String("somebody");
  }});
  Home home = connected<Home>();
  home.ldEnabled(true);
  String items;
  EXPECT_EQ(home.getUsersFromLDS(items), platform::directoryUnreachable);
  tables_.run("update users set uType=3,ldDn='cn=admin',accstate=0 where userLogin='Admin'");
  User admin = connected<User>();
  EXPECT_EQ(refusal(admin, admin.GetOne(3, "Admin", true, "secret")), messageNumber(1131));
  EXPECT_EQ(asked, 0);
}

}  // namespace
}  // namespace QVSa
