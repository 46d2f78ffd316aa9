#include <ctime>
#include <fcntl.h>
#include <sys/stat.h>

#include "platform/Files.h"
#include "tests/support/SettingsScene.h"

namespace QVSa {
namespace {

class HomePicturesTest : public test::SettingsScene {
 protected:
  // A file with bytes that no text has.
  String picture(std::size_t size, std::uint8_t seed = 7) {
    Bytes content(size);
    for (std::size_t i = 0; i < size; ++i) content[i] = static_cast<std::uint8_t>(i * 31 + i / 4096 + seed);
    const String path = (files_.path() / "picture").string();
    platform::writeFile(path, content);
    return path;
  }
  String local(const char* name) const { return (programFolder_.path() / name).string(); }
  bool exists(const char* name) const { return std::filesystem::exists(local(name)); }
  Home fetched() {
    Home home;
    EXPECT_TRUE(home.getImage(server())) << home.errDescription();
    return home;
  }

  test::TestFolder files_;
};

TEST_F(HomePicturesTest, PicturesOfEverySizeGoThereAndBack) {
  Home home = connected<Home>();
  for (const std::size_t size : {std::size_t{1}, std::size_t{4096}, std::size_t{4097}, std::size_t{20} << 20}) {
    const String path = picture(size);
    home.LoginImageFile(path);
    home.customFormIcon(path);
    ASSERT_TRUE(home.Save()) << home.errDescription();
    std::filesystem::remove(local("LoginImage"));
    std::filesystem::remove(local("formicon.ico"));
    const Home other = fetched();
    EXPECT_EQ(platform::readFile(other.LoginImageFile()), platform::readFile(path)) << size;
    EXPECT_EQ(platform::readFile(other.customFormIcon()), platform::readFile(path)) << size;
    EXPECT_EQ(other.LoginImageFile(), programFolder_.path().string() + "\\LoginImage");
  }
}

TEST_F(HomePicturesTest, AnEmptyFileSendsNothingAndAnEmptyPathClears) {
  Home home = connected<Home>();
  home.LoginImageFile(picture(10));
  ASSERT_TRUE(home.Save());
  home.LoginImageFile(picture(0));
  ASSERT_TRUE(home.Save()) << home.errDescription();
  EXPECT_EQ(platform::readFile(fetched().LoginImageFile()).size(), 10U) << "the stored picture stays";

  home.LoginImageFile("");
  ASSERT_TRUE(home.Save());
  EXPECT_EQ(fetched().LoginImageFile(), "");
  EXPECT_FALSE(exists("LoginImage")) << "the local copy goes with the stored picture";
}

TEST_F(HomePicturesTest, AHomeThatFetchedThePicturesSendsThemBack) {
  Home home = connected<Home>();
  home.LoginImageFile(picture(5000));
  home.loginTitle("Welcome");
  ASSERT_TRUE(home.Save());

  Home kept = fetched();
  ASSERT_TRUE(kept.connect(server()));
  kept.Fax("1");
  ASSERT_TRUE(kept.Save());
  EXPECT_EQ(platform::readFile(fetched().LoginImageFile()).size(), 5000U);
  EXPECT_EQ(stored("loginTitle"), "Welcome");

  Home forgetful = connected<Home>();
  ASSERT_TRUE(forgetful.Save());
  EXPECT_EQ(fetched().LoginImageFile(), "");
  EXPECT_EQ(stored("loginTitle"), "");
}

TEST_F(HomePicturesTest, OnlyALocalFileNewerThanTheLastSaveStays) {
  Home home = connected<Home>();
  home.LoginImageFile(picture(100));
  ASSERT_TRUE(home.Save());
  platform::writeFile(local("LoginImage"), Bytes{1});
  const auto size = [&] { return platform::readFile(fetched().LoginImageFile()).size(); };

  store("UpdTime='20200101 10:00:00'");
  EXPECT_EQ(size(), 1U) << "newer";
  // The file's time becomes the stamp exactly.
  std::tm parts{};
  parts.tm_year = 120;
  parts.tm_mday = 1;
  parts.tm_hour = 10;
  parts.tm_isdst = -1;
  const timespec stamp{std::mktime(&parts), 0};
  const timespec times[] = {stamp, stamp};
  ASSERT_EQ(utimensat(AT_FDCWD, local("LoginImage").c_str(), times, 0), 0);
  EXPECT_EQ(size(), 100U) << "of the same time";
  platform::writeFile(local("LoginImage"), Bytes{1});
  store("UpdTime=null");
  EXPECT_EQ(size(), 100U) << "no save is known";
}

TEST_F(HomePicturesTest, APictureThatCannotBeMovedIsNoFailureAndToldToTheEventLog) {
  std::vector<String> events;
  replace(&platform::Services::eventLog, {[&](const String& line) { events.push_back(line); }});
  Home home = connected<Home>();
  home.LoginImageFile(picture(10));
  ASSERT_TRUE(home.Save());
  home.LoginImageFile((files_.path() / "missing").string());
  home.Fax("stored all the same");
  EXPECT_TRUE(home.Save());
  EXPECT_EQ(home.errDescription(), "File not found");
  EXPECT_EQ(home.errNumber(), 0);
  EXPECT_EQ(stored("fax"), "stored all the same");

  replace(&platform::Services::programFolder, {[this] { return (files_.path() / "nowhere").string(); }});
  Home other;
  EXPECT_TRUE(other.getImage(server()));
  EXPECT_EQ(other.LoginImageFile(), "");
  EXPECT_EQ(other.errDescription(), "Path not found");

  replace(&platform::Services::programFolder, {[this] { return (files_.path() / "local").string(); }});
  std::filesystem::create_directories(files_.path() / "local" / "LoginImage");
  for (const char* image : {"LoginImage", "null"}) {
    store("UpdTime='20200101',LoginImage=" + String(image));
    EXPECT_TRUE(other.getImage(server())) << "a folder is no picture, however new";
    EXPECT_EQ(other.LoginImageFile(), "");
    EXPECT_EQ(other.errDescription(), "Path/File access error");
  }
  EXPECT_EQ(events, (std::vector<String>{"File not found", "Path not found", "Path/File access error"}));
}

TEST_F(HomePicturesTest, WithoutARowNothingIsFetched) {
  tables_.run("delete from homeinfo");
  platform::writeFile(local("LoginImage"), Bytes{1});
  fetched();
  EXPECT_TRUE(exists("LoginImage"));

  Home home;
  EXPECT_FALSE(home.getImage("file:" + (files_.path() / "no installation").string()));
  EXPECT_NE(home.errNumber(), 0);
}

}  // namespace
}  // namespace QVSa
