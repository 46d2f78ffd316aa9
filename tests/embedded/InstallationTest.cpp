#include <fstream>
#include <gtest/gtest.h>
#include <sys/stat.h>

#include "QVSa/frame/Failure.h"
#include "providers/embedded/Installation.h"
#include "providers/embedded/Layout.h"
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
  plan.folder = below(485);
  const Failure notMade = test::thrownBy([&] { createInstallation(plan); });
  EXPECT_EQ(notMade.number(), number::pathAccess);
  EXPECT_NE(notMade.description().find("485 bytes"), String::npos) << notMade.description();
  plan.folder = below(484);
  createInstallation(plan);

  std::filesystem::rename(plan.folder, below(493));
  const Failure notOpened = test::thrownBy([&] { acquireHandle(below(493)); });
  EXPECT_EQ(notOpened.native(), 4060);
  EXPECT_NE(notOpened.description().find("493 bytes"), String::npos) << notOpened.description();
}

}  // namespace
}  // namespace QVSa::embedded
