#include <filesystem>
#include <fstream>
#include <gtest/gtest.h>
#include <map>
#include <sys/stat.h>
#include <sys/syscall.h>
#include <unistd.h>

#include "providers/embedded/administration/Backup.h"
#include "providers/embedded/administration/Restore.h"
#include "tests/embedded/InstallationFolder.h"

// This program's own calls to the system come by here first. A rename is on the disk only when the folder is synced,
// and what was not synced before it may then be gone with the old content.
namespace {

struct Renames {
  std::map<ino_t, struct stat> synced;  // as the files were when they were synced
  std::map<ino_t, int> toSync;          // folders, by the renames into them that are not on the disk yet
  int count = 0;

  bool isSynced(const std::string& path) const {
    struct stat now {};
    if (::stat(path.c_str(), &now) != 0) return false;
    const auto then = synced.find(now.st_ino);
    return then != synced.end() && then->second.st_size == now.st_size &&
           then->second.st_mtim.tv_sec == now.st_mtim.tv_sec && then->second.st_mtim.tv_nsec == now.st_mtim.tv_nsec;
  }
};

Renames* renames = nullptr;

void record(const std::string& from, const std::string& to) {
  ++renames->count;
  EXPECT_TRUE(renames->isSynced(from)) << from;
  if (std::filesystem::is_directory(from)) {
    for (const auto& entry : std::filesystem::directory_iterator(from))
      EXPECT_TRUE(renames->isSynced(entry.path())) << entry.path();
  }
  struct stat folder {};
  ::stat(std::filesystem::path(to).parent_path().c_str(), &folder);
  ++renames->toSync[folder.st_ino];
}

}  // namespace

extern "C" int fsync(int file) {
  struct stat now {};
  if (renames && ::fstat(file, &now) == 0) {
    renames->synced[now.st_ino] = now;
    renames->toSync.erase(now.st_ino);
  }
  return static_cast<int>(::syscall(SYS_fsync, file));
}

extern "C" int rename(const char* from, const char* to) noexcept {
  // What is put aside is on the disk already.
  if (renames && std::string(to).find(".replaced-") == std::string::npos) record(from, to);
  return static_cast<int>(::syscall(SYS_rename, from, to));
}

namespace QVSa::embedded {
namespace {

TEST(Sync, WhateverTakesAnothersPlaceIsOnTheDiskBeforeAndItsNameAfterwards) {
  Renames recorded;
  renames = &recorded;
  {
    const InstallationFolder folder;
    EXPECT_EQ(recorded.count, 1) << "an installation";
    const std::string copy = (folder.root() / "copy").string();
    backUp(*acquireHandle(folder.data()), 1, copy);
    EXPECT_EQ(recorded.count, 2) << "a backup";
    discardIdleHandle(folder.data());
    std::ofstream(databaseFile(folder.data(), "QVSys")) << "damaged";
    restoreCopy(Handle(folder.data(), Handle::Unreadable::replaced), 1, copy);
    EXPECT_EQ(recorded.count, 3) << "a database that could not be read";
    EXPECT_TRUE(recorded.toSync.empty());
    EXPECT_TRUE(acquireHandle(folder.data())->isCurrent());
  }
  renames = nullptr;
}

}  // namespace
}  // namespace QVSa::embedded
