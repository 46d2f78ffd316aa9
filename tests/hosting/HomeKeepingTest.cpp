#include <filesystem>
#include <fstream>

#include "QVSa/hosting/HomeKeeping.h"
#include "tests/support/Scene.h"

namespace QVSa::test {
namespace {

class HomeKept : public Scene {
 protected:
  String write(const char* name, const String& content) const {
    const auto path = folder_.path() / name;
    std::ofstream(path) << content;
    return path.string();
  }
  String settings() const { return tables_.text("select fax,loginTitle,LoginNewsUrl from homeinfo"); }

  TestFolder folder_;
};

TEST_F(HomeKept, ASaveBringsPicturesTitleAndNewsPageBack) {
  tables_.run("update homeinfo set loginTitle='Hello',LoginNewsUrl='http://x'");
  auto keeping = connected<HomeKeeping>();
  Home home;
  ASSERT_TRUE(keeping.load(home)) << keeping.errDescription();
  EXPECT_EQ(home.LoginImageFile(), "");
  home.LoginImageFile(write("picture", "a picture"));
  home.customFormIcon(write("icon", "an icon"));
  ASSERT_TRUE(keeping.save(home)) << keeping.errDescription();

  auto other = connected<HomeKeeping>();
  Home again;
  ASSERT_TRUE(other.load(again)) << other.errDescription();
  again.Fax("12");
  again.customFormIcon("");
  ASSERT_TRUE(other.save(again)) << other.errDescription();
  EXPECT_EQ(settings(), "12|Hello|http://x");
  String loginImage, icon;
  write("formicon.ico", "of another time");
  ASSERT_TRUE(other.fetchPictures(folder_.path().string(), loginImage, icon)) << other.errDescription();
  EXPECT_EQ(icon, "");
  EXPECT_FALSE(std::filesystem::exists(folder_.path() / "formicon.ico"));
  std::string content;
  std::getline(std::ifstream(loginImage), content);
  EXPECT_EQ(content, "a picture");

  again.Fax("13");
  again.customFormIcon("/no such file");
  EXPECT_FALSE(other.save(again));
  EXPECT_EQ(other.errNumber(), number::noFile);
  EXPECT_EQ(settings(), "12|Hello|http://x") << "nothing of it is stored";

  const auto place = std::filesystem::path(again.LoginImageFile()).parent_path();
  EXPECT_EQ(std::filesystem::status(place).permissions(), std::filesystem::perms::owner_all);
  other = HomeKeeping();
  EXPECT_FALSE(std::filesystem::exists(place));
}

}  // namespace
}  // namespace QVSa::test
