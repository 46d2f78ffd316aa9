#include "providers/embedded/storage/ReplacedFile.h"

#include <cerrno>
#include <ctime>
#include <fcntl.h>
#include <initializer_list>
#include <sys/stat.h>
#include <system_error>
#include <unistd.h>

#include "platform/FileDescriptor.h"
#include "platform/NewFile.h"
#include "providers/embedded/storage/StorageFailure.h"
#include "providers/tsql/SqlFailure.h"

namespace QVSa::embedded {

namespace {

namespace fs = std::filesystem;

constexpr mode_t fileMode = S_IRUSR | S_IWUSR | S_IRGRP | S_IWGRP;

fs::path with(const fs::path& file, const std::string& ending) { return file.string() + ending; }

bool syncFile(const fs::path& path) {
  const platform::FileDescriptor file(::open(path.c_str(), O_RDONLY | O_CLOEXEC));
  return file.isOpen() && ::fsync(file.get()) == 0;
}

}  // namespace

ReplacedFile::ReplacedFile(const fs::path& target)
    : target_(target),
      beside_(with(target, ".new")),
      passing_{beside_, with(beside_, "-wal"), with(beside_, "-shm"), with(beside_, "-journal")} {
  ::unlink(beside_.c_str());
  const int file = ::open(beside_.c_str(), O_RDWR | O_CREAT | O_EXCL | O_CLOEXEC, fileMode);
  if (file < 0) fail();
  ::fchmod(file, fileMode);
  ::close(file);
  const int code = sqlite3_open_v2(beside_.c_str(), &handle_, SQLITE_OPEN_READWRITE, nullptr);
  if (code == SQLITE_OK) return;
  close();
  ::unlink(beside_.c_str());
  errno = EIO;
  fail();
}

ReplacedFile::~ReplacedFile() {
  close();
  for (const fs::path& file : passing_) ::unlink(file.c_str());
}

void ReplacedFile::takePlace() {
  const int code = sqlite3_exec(handle_, "pragma journal_mode=wal", nullptr, nullptr, nullptr);
  if (code != SQLITE_OK) throwStorageFailure(handle_, code);
  close();
  if (!syncFile(beside_)) fail();
  keepOld();
  if (::rename(beside_.c_str(), target_.c_str()) != 0 || !platform::syncFolderOf(target_)) fail();
}

// Its write-ahead log goes with it: played into the new file it would ruin that.
void ReplacedFile::keepOld() const {
  const fs::path old = with(target_, ".replaced-" + std::to_string(std::time(nullptr)));
  for (const char* ending : {"-wal", ""})
    if (::rename(with(target_, ending).c_str(), with(old, ending).c_str()) != 0 && errno != ENOENT) fail();
  ::unlink(with(target_, "-shm").c_str());
}

void ReplacedFile::close() {
  sqlite3_close(handle_);
  handle_ = nullptr;
}

void ReplacedFile::fail() const {
  throw tsql::sqlFailure(
      823, "The file '" + target_.string() + "' cannot be replaced: " + std::generic_category().message(errno) + ".");
}

}  // namespace QVSa::embedded
