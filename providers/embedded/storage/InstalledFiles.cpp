#include "providers/embedded/storage/InstalledFiles.h"

#include <ctime>

namespace QVSa::embedded {

namespace {

// A folder that has changed so shortly before may change again without its time showing it.
constexpr time_t secondsToSettle = 2;

bool isSettled(const timespec& changed) {
  timespec now{};
  ::clock_gettime(CLOCK_REALTIME, &now);
  return now.tv_sec - changed.tv_sec >= secondsToSettle;
}

bool areSame(const timespec& a, const timespec& b) { return a.tv_sec == b.tv_sec && a.tv_nsec == b.tv_nsec; }

}  // namespace

InstalledFiles::InstalledFiles(const std::filesystem::path& folder) : folder_(folder), files_(look()) {}

bool InstalledFiles::areCurrent() {
  struct stat folder {};
  if (::stat(folder_.c_str(), &folder) != 0) return false;
  const Identity folderNow{folder.st_dev, folder.st_ino};
  if (folderNow == folderThen_ && areSame(folder.st_mtim, changedThen_)) return true;
  if (look() != files_) return false;
  folderThen_ = isSettled(folder.st_mtim) ? folderNow : Identity{};
  changedThen_ = folder.st_mtim;
  return true;
}

InstalledFiles::Identities InstalledFiles::look() const {
  Identities found;
  for (std::size_t i = 0; i < found.size(); ++i) {
    struct stat file {};
    if (::stat(databaseFile(folder_, databaseNames[i]).c_str(), &file) == 0) found[i] = {file.st_dev, file.st_ino};
  }
  return found;
}

}  // namespace QVSa::embedded
