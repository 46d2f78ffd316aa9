#include <cstdlib>

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
    replace(&platform::Services::openSettings, services_.openSettings);
    setenv("QVSA_SETTINGS", root_.path().c_str(), 1);
  }
  ~MachineSettingsTest() override { unsetenv("QVSA_SETTINGS"); }

  void makeKey() { std::filesystem::create_directories(root_.path() / "Software/Morvane/Tabulon"); }
  std::optional<String> value(const char* name) { return platform::openSettings(machineSettingsKey)->value(name); }
  void fetch() {
    Home home;
    ASSERT_TRUE(home.getImage(installation_.server())) << home.errDescription();
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
  EXPECT_EQ(platform::openSettings("..\\Software"), nullptr);
}

TEST_F(MachineSettingsTest, TheStoreTellsHowToSpeakToTheDirectory) {
  EXPECT_EQ(directorySecurity(), Security::byPort) << "no key";
  makeKey();
  EXPECT_EQ(directorySecurity(), Security::byPort);
  const auto key = platform::openSettings(machineSettingsKey);
  EXPECT_TRUE(key->write("directorySecurity", "startTls"));
  EXPECT_EQ(directorySecurity(), Security::startTls);
  EXPECT_TRUE(key->write("directorySecurity", "tls"));
  EXPECT_EQ(directorySecurity(), Security::tls);
  EXPECT_TRUE(key->remove("directorySecurity"));
  EXPECT_TRUE(key->remove("directorySecurity")) << "there was none";
}

}  // namespace
}  // namespace QVSa
