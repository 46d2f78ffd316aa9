#include <csignal>
#include <fcntl.h>
#include <fstream>
#include <future>
#include <gtest/gtest.h>
#include <sys/stat.h>
#include <tuple>
#include <unistd.h>

#include "platform/Files.h"
#include "platform/NewFile.h"
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

  // For the superuser alone.
  static constexpr uid_t stranger = 65'534;

  std::filesystem::path folder_;
};

// A test as another account, which the superuser can be for a while.
class As {
 public:
  explicit As(uid_t account) : isDone_(::geteuid() == 0 && ::seteuid(account) == 0) {}
  ~As() {
    if (isDone_ && ::seteuid(0) != 0) std::abort();
  }
  bool isDone() const { return isDone_; }

 private:
  bool isDone_;
};

struct stat stateOf(const String& file) {
  struct stat state {};
  ::lstat(file.c_str(), &state);
  return state;
}

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

TEST_F(Files, KeepTheOwnerAndTheModeOfWhatTheyReplaceAndTheLinksToIt) {
  writeFile(path("private"), {1});
  ASSERT_EQ(::chmod(path("private").c_str(), 0600), 0);
  if (geteuid() == 0) std::ignore = ::chown(path("private").c_str(), stranger, stranger);
  const struct stat before = stateOf(path("private"));
  std::filesystem::create_symlink("link", folder_ / "chain");
  std::filesystem::create_symlink("private", folder_ / "link");
  writeFile(path("chain"), {2});
  const struct stat after = stateOf(path("private"));
  EXPECT_EQ(readFile(path("private")), Bytes{2});
  EXPECT_NE(after.st_ino, before.st_ino);
  EXPECT_EQ(std::tie(after.st_mode, after.st_uid, after.st_gid),
            std::tie(before.st_mode, before.st_uid, before.st_gid));
  EXPECT_TRUE(std::filesystem::is_symlink(folder_ / "chain") && std::filesystem::is_symlink(folder_ / "link"));

  std::filesystem::create_symlink("new", folder_ / "dangling");
  writeFile(path("dangling"), {3});
  EXPECT_EQ(readFile(path("new")), Bytes{3});
  std::filesystem::create_symlink("circle", folder_ / "circle");
  EXPECT_EQ(failureOf([&] { writeFile(path("circle"), {3}); }), number::pathAccess);
  EXPECT_EQ(entries(), 6U);
}

TEST_F(Files, ThatAreNoPlainOnesAreWrittenStraight) {
  std::filesystem::create_symlink("/dev/null", folder_ / "null");
  writeFile(path("null"), {1});
  EXPECT_TRUE(std::filesystem::is_symlink(folder_ / "null") && std::filesystem::is_character_file("/dev/null"));
  EXPECT_EQ(failureOf([&] { writeFile("/dev/full", {1}); }), number::pathAccess);

  ASSERT_EQ(::mkfifo(path("pipe").c_str(), 0600), 0);
  const Bytes content(200'000, 7);
  auto reader = std::async(std::launch::async, [&] { return readFile(path("pipe")); });
  writeFile(path("pipe"), content);
  EXPECT_EQ(reader.get(), content);
  reader = std::async(std::launch::async, [&] {
    std::ifstream(path("pipe")).get();
    return Bytes();
  });
  EXPECT_EQ(failureOf([&] { writeFile(path("pipe"), content); }), number::pathAccess) << "the reader went";

  int ends[2];
  ASSERT_EQ(::pipe2(ends, O_CLOEXEC), 0);
  writeFile("/proc/self/fd/" + std::to_string(ends[1]), {1, 2});
  Bytes received(3);
  EXPECT_EQ(::read(ends[0], received.data(), received.size()), 2);
  for (const int end : ends) ::close(end);
  EXPECT_EQ(entries(), 2U);
}

TEST_F(Files, ThatCanNotBeReplacedButWrittenAreWrittenStraight) {
  if (geteuid() != 0) GTEST_SKIP() << "Only the superuser can be somebody else as well.";
  writeFile(path("open"), {1, 2, 3});
  ASSERT_EQ(::chmod(path("open").c_str(), 0666), 0);
  const ino_t before = stateOf(path("open")).st_ino;
  for (const mode_t mode : {0755, 01777}) {  // nothing can be made there; it can, but takes no other's place
    ASSERT_EQ(::chmod(folder_.c_str(), mode), 0);
    const As somebodyElse(stranger);
    ASSERT_TRUE(somebodyElse.isDone());
    writeFile(path("open"), {4});
    NewFile(path("open")).write("given up");
    const NewFile only(path("open"), NewFile::Writers::one);
    EXPECT_EQ(failureOf([&] { NewFile second(path("open"), NewFile::Writers::one); }), number::pathAccess);
    EXPECT_EQ(readFile(path("open")), Bytes{4});
  }
  EXPECT_EQ(stateOf(path("open")).st_ino, before);
  EXPECT_EQ(stateOf(path("open")).st_uid, 0U);
  EXPECT_EQ(entries(), 1U);
}

TEST_F(Files, BehindALinkThatSomebodyElseLaidAreNotTouched) {
  if (geteuid() != 0) GTEST_SKIP() << "Only the superuser can be somebody else as well.";
  writeFile(path("file"), {1});
  std::filesystem::create_symlink("file", folder_ / "link");
  ASSERT_EQ(::lchown(path("link").c_str(), stranger, stranger), 0);
  ASSERT_EQ(::chmod(folder_.c_str(), 01777), 0);
  EXPECT_EQ(failureOf([&] { writeFile(path("link"), {2}); }), number::accessDenied);
  EXPECT_EQ(readFile(path("file")), Bytes{1});
  ASSERT_EQ(::chmod(folder_.c_str(), 0755), 0);
  writeFile(path("link"), {2});
  EXPECT_EQ(readFile(path("file")), Bytes{2}) << "nobody else can have laid it";
  ASSERT_EQ(::chmod(folder_.c_str(), 01777), 0);
  ASSERT_EQ(::lchown(path("link").c_str(), 0, 0), 0);
  writeFile(path("link"), {3});
  EXPECT_EQ(readFile(path("file")), Bytes{3}) << "it is the writer's own";
}

TEST_F(Files, MayHaveAnyNameButThoseOfAnInstallationsFiles) {
  const String longest(255, 'n');
  writeFile(path(longest), {1});
  EXPECT_EQ(readFile(path(longest)), Bytes{1});
  EXPECT_EQ(failureOf([&] { writeFile(path("n" + longest), {1}); }), number::pathAccess);
  EXPECT_EQ(failureOf([&] { writeFile(path(String("cut\0here", 8)), {1}); }), number::pathAccess);
  EXPECT_EQ(entries(), 1U);

  writeFile(path("QVSys.db"), {1});
  writeFile(path("QVApp.lock"), {});
  std::filesystem::create_symlink("QVSys.db", folder_ / "log.txt");
  for (const char* own : {"QVSys.db", "QVUpdate.db-wal", "master.lock", "log.txt"})
    EXPECT_EQ(failureOf([&] { writeFile(path(own), {2}); }), number::accessDenied) << own;
  EXPECT_EQ(readFile(path("QVSys.db")), Bytes{1});
}

TEST_F(Files, ThatTheUserMayNotTouchAreRefused) {
  writeFile(path("closed"), {1});
  ASSERT_EQ(::chmod(path("closed").c_str(), 0), 0);
  ASSERT_EQ(::chmod(folder_.c_str(), 0555), 0);
  {
    const As somebodyElse(stranger);
    EXPECT_EQ(failureOf([&] { readFile(path("closed")); }), number::accessDenied);
    for (const char* name : {"closed", "other"})
      EXPECT_EQ(failureOf([&] { writeFile(path(name), {1}); }), number::accessDenied) << name;
  }
  ::chmod(folder_.c_str(), 0755);
}

}  // namespace
}  // namespace QVSa::platform
