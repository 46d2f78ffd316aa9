#include <gtest/gtest.h>
#include <unistd.h>

#include "platform/Files.h"
#include "tests/support/Failures.h"

namespace QVSa::platform {
namespace {

using test::failureOf;

class Files : public testing::Test {
 protected:
  void SetUp() override {
    String name = (std::filesystem::temp_directory_path() / "files-XXXXXX").string();
    ASSERT_NE(mkdtemp(name.data()), nullptr);
    folder_ = name;
  }
  void TearDown() override { std::filesystem::remove_all(folder_); }

  String path(const String& name) const { return folder_.string() + "/" + name; }

  std::size_t entries() const {
    return static_cast<std::size_t>(
        std::distance(std::filesystem::directory_iterator(folder_), std::filesystem::directory_iterator()));
  }

  std::filesystem::path folder_;
};

TEST_F(Files, AreReadAsTheyWereWritten) {
  const Bytes odd{0, 255, '\r', '\n', 0, 26};
  for (const Bytes& content : {Bytes(), odd, Bytes(100000, 7)}) {
    writeFile(path("content"), content);
    EXPECT_EQ(readFile(path("content")), content);
  }
  EXPECT_EQ(entries(), 1U);
  // A file without a size of its own.
  EXPECT_GT(readFile("/proc/self/stat").size(), 50U);
}

TEST_F(Files, AreFoundByEitherSeparator) {
  std::filesystem::create_directory(folder_ / "sub");
  writeFile(path("sub\\image"), {1});
  EXPECT_EQ(readFile(path("sub/image")), Bytes{1});
  EXPECT_EQ(localPath("a\\b/c"), "a/b/c");
}

TEST_F(Files, FailWithTheRunTimesNumbers) {
  writeFile(path("file"), {1});
  EXPECT_EQ(failureOf([&] { readFile(path("missing")); }), number::noFile);
  EXPECT_EQ(failureOf([&] { readFile(path("missing/file")); }), number::noPath);
  EXPECT_EQ(failureOf([&] { readFile(path("file/below")); }), number::noPath);
  EXPECT_EQ(failureOf([&] { readFile(path("")); }), number::pathAccess);
  EXPECT_EQ(failureOf([&] { writeFile(path("missing/file"), {1}); }), number::noPath);
}

TEST_F(Files, ThatDoNotTakeTheirPlaceLeaveNothingBehind) {
  std::filesystem::create_directories(folder_ / "taken" / "sub");
  EXPECT_EQ(failureOf([&] { writeFile(path("taken"), {1}); }), number::pathAccess);
  EXPECT_EQ(failureOf([] { NewFile nameless(""); }), number::pathAccess);
  writeFile(path("file"), {1});
  NewFile(path("file")).write("given up");
  EXPECT_EQ(readFile(path("file")), Bytes{1});
  EXPECT_EQ(entries(), 2U);
}

TEST_F(Files, ThatTheUserMayNotTouchAreRefused) {
  if (geteuid() == 0) GTEST_SKIP() << "The superuser may touch everything.";
  writeFile(path("closed"), {1});
  std::filesystem::permissions(path("closed"), std::filesystem::perms::none);
  EXPECT_EQ(failureOf([&] { readFile(path("closed")); }), number::accessDenied);
  std::filesystem::permissions(folder_, std::filesystem::perms::owner_read | std::filesystem::perms::owner_exec);
  EXPECT_EQ(failureOf([&] { writeFile(path("other"), {1}); }), number::accessDenied);
  std::filesystem::permissions(folder_, std::filesystem::perms::owner_all);
}

}  // namespace
}  // namespace QVSa::platform
