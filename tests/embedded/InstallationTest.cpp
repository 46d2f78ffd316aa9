#include <fstream>
#include <gtest/gtest.h>
#include <sys/stat.h>
#include <unistd.h>

#include "QVSa/values/Failure.h"
#include "providers/Installation.h"
#include "providers/embedded/storage/Layout.h"
#include "tests/embedded/InstallationFolder.h"
#include "tests/support/Failures.h"

namespace QVSa::embedded {
namespace {

mode_t modeOf(const std::filesystem::path& path) {
  struct stat file {};
  ::stat(path.c_str(), &file);
  return file.st_mode & 07777;
}

bool isEmpty(const std::filesystem::path& folder) { return std::filesystem::is_empty(folder); }

TEST(Installation, OwnerAndGroupAloneCanGetAtIt) {
  const mode_t before = ::umask(077);
  InstallationFolder folder;
  ::umask(before);
  EXPECT_TRUE(isInstallation(folder.data()));
  EXPECT_EQ(modeOf(folder.data()), 02770);
  for (const char* name : databaseNames) {
    EXPECT_EQ(modeOf(databaseFile(folder.data(), name)), 0660);
    EXPECT_EQ(modeOf(lockFile(folder.data(), name)), 0660);
  }
  // No journal is left from the making of it, and nothing beside it.
  EXPECT_EQ(std::distance(std::filesystem::directory_iterator(folder.data()), {}), 2 * std::ssize(databaseNames));
  EXPECT_EQ(std::distance(std::filesystem::directory_iterator(folder.root()), {}), 1);
}

TEST(Installation, AFolderWithSomethingInItIsLeftAlone) {
  InstallationFolder folder(false);
  std::filesystem::create_directory(folder.data());
  std::ofstream(folder.data() / "letter.txt") << "kept";
  EXPECT_FALSE(isInstallation(folder.data()));
  EXPECT_EQ(test::failureOf([&] { createInstallation(folder.plan()); }), 58);
  std::filesystem::remove(folder.data() / "letter.txt");
  createInstallation(folder.plan());
  EXPECT_TRUE(isInstallation(folder.data()));
}

TEST(Installation, AnEmptyFolderKeepsItsOwnerAndTheLinkToIt) {
  if (::geteuid() != 0) GTEST_SKIP() << "Only the superuser can be somebody else as well.";
  constexpr uid_t stranger = 65'534;
  // Once beside it, once in a folder above that the owner can't write.
  for (const uid_t maker : {uid_t{0}, stranger}) {
    InstallationFolder folder(false);
    const auto owned = folder.root() / "owned";
    std::filesystem::create_directory(owned);
    std::filesystem::create_directory_symlink("owned", folder.data());
    ASSERT_EQ(::chown(owned.c_str(), stranger, stranger), 0);
    ASSERT_EQ(::chmod(folder.root().c_str(), 0755), 0);
    InstallationPlan plan = folder.plan();
    ASSERT_TRUE(::setegid(maker) == 0 && ::seteuid(maker) == 0);
    plan.scripts = {{"QVApp", "create nonsense"}};
    EXPECT_THROW(createInstallation(plan), Failure);
    EXPECT_TRUE(isEmpty(owned));
    plan.scripts.clear();
    EXPECT_NO_THROW(createInstallation(plan));
    ASSERT_TRUE(::seteuid(0) == 0 && ::setegid(0) == 0);
    EXPECT_TRUE(isInstallation(owned));
    EXPECT_EQ(modeOf(owned), 02770);
    EXPECT_TRUE(std::filesystem::is_symlink(folder.data()));
    EXPECT_EQ(std::distance(std::filesystem::directory_iterator(owned), {}), 2 * std::ssize(databaseNames));
    for (const auto& file : {owned, databaseFile(owned, "QVSys"), lockFile(owned, "QVSys")}) {
      struct stat state {};
      EXPECT_EQ(::stat(file.c_str(), &state), 0);
      EXPECT_TRUE(state.st_uid == stranger && state.st_gid == stranger) << file;
    }
  }
}

TEST(Installation, AScriptThatFailsLeavesNothingBehind) {
  InstallationFolder folder(false);
  InstallationPlan plan = folder.plan();
  plan.scripts = {{"QVSys", "create table a(x int)"}, {"QVApp", "create nonsense"}};
  EXPECT_THROW(createInstallation(plan), Failure);
  EXPECT_TRUE(isEmpty(folder.root()));
}

TEST(Installation, APathThatIsTooLongIsRefusedByItsLength) {
  InstallationFolder folder;
  const auto below = [&](std::size_t length) {
    std::filesystem::path path = folder.root();
    while (path.native().size() + 200 < length) path /= String(100, 'x');
    std::filesystem::create_directories(path);
    return path / String(length - path.native().size() - 1, 'y');
  };
  InstallationPlan plan = folder.plan();
  plan.folder = below(476);
  const Failure notMade = test::thrownBy([&] { createInstallation(plan); });
  EXPECT_EQ(notMade.number(), number::pathAccess);
  EXPECT_NE(notMade.description().find("476 bytes"), String::npos) << notMade.description();
  plan.folder = below(475);
  createInstallation(plan);

  std::filesystem::rename(plan.folder, below(493));
  const Failure notOpened = test::thrownBy([&] { acquireHandle(below(493)); });
  EXPECT_EQ(notOpened.native(), 4060);
  EXPECT_NE(notOpened.description().find("493 bytes"), String::npos) << notOpened.description();
}

}  // namespace
}  // namespace QVSa::embedded
