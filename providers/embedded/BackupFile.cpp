#include "providers/embedded/BackupFile.h"

#include <cerrno>
#include <charconv>
#include <memory>
#include <new>
#include <sys/stat.h>
#include <system_error>
#include <unistd.h>

#include "platform/Files.h"
#include "providers/embedded/Layout.h"
#include "providers/embedded/StorageFailure.h"
#include "providers/tsql/SqlFailure.h"

namespace QVSa::embedded {

namespace {

using tsql::sqlFailure;

constexpr int stepsBetweenLooks = 1000;
constexpr const char* pageSize = "4096";

struct Finalize {
  void operator()(sqlite3_stmt* statement) const { sqlite3_finalize(statement); }
};

// 0 for a text that is no whole number.
int wholeNumber(const std::string& text) {
  int number = 0;
  const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
  return error == std::errc() && end == text.data() + text.size() ? number : 0;
}

}  // namespace

Failure cannotOpenDevice(const String& path, int systemError) {
  return sqlFailure(3201, "Cannot open backup device '" + path + "'. Operating system error " +
                              std::to_string(systemError) + "(" + std::generic_category().message(systemError) + ").");
}

BackupFile::BackupFile(const String& path, Deadline deadline) : path_(path), deadline_(deadline) {
  try {
    open();
    checkForm();
  } catch (...) {
    sqlite3_close_v2(handle_);
    throw;
  }
}

BackupFile::~BackupFile() { sqlite3_close_v2(handle_); }

void BackupFile::open() {
  const std::string file = platform::localPath(path_).string();
  struct stat state {};
  if (::stat(file.c_str(), &state) != 0 || ::access(file.c_str(), R_OK) != 0) throw cannotOpenDevice(path_, errno);
  // An empty file would pass for an empty database.
  if (!S_ISREG(state.st_mode) || state.st_size == 0) refuse();
  const int flags = SQLITE_OPEN_READONLY | SQLITE_OPEN_NOMUTEX | SQLITE_OPEN_PRIVATECACHE | SQLITE_OPEN_EXRESCODE;
  const int code = sqlite3_open_v2(file.c_str(), &handle_, flags, nullptr);
  requireMemory(code);
  if (code != SQLITE_OK) refuse();
  sqlite3_db_config(handle_, SQLITE_DBCONFIG_TRUSTED_SCHEMA, 0, nullptr);
  sqlite3_progress_handler(handle_, stepsBetweenLooks, onProgress, this);
  registerFunctions(handle_, context_);
}

// A page of another size would need the file's own pages cut anew, which a restore in one step cannot do.
void BackupFile::checkForm() {
  if (read("pragma application_id") != std::to_string(applicationId) || read("pragma page_size") != pageSize) refuse();
  const int layout = wholeNumber(read("select layout from engine"));
  if (layout < 1) refuse();
  if (layout > layoutVersion)
    throw sqlFailure(3169, "The database was backed up with layout " + std::to_string(layout) +
                               ". This program knows layouts up to " + std::to_string(layoutVersion) +
                               "; a newer release has to restore it.");
}

bool BackupFile::isOf(std::size_t database) {
  const int mark = wholeNumber(read("pragma user_version"));
  return mark == 0 || mark == static_cast<int>(database) + 1;
}

void BackupFile::check() {
  const auto isWhole = [this] { return read("pragma integrity_check(1)") == "ok"; };
  // To the storage library a page that it has no memory for is damage, too. Such damage is not found twice.
  if (!isWhole() && !isWhole()) refuse();
}

// The first column of the first row; empty without one, for NULL, and where the file cannot be read.
std::string BackupFile::read(const std::string& query) {
  sqlite3_stmt* statement = nullptr;
  int code = sqlite3_prepare_v2(handle_, query.c_str(), -1, &statement, nullptr);
  if (code == SQLITE_OK) code = sqlite3_step(statement);
  const std::unique_ptr<sqlite3_stmt, Finalize> owned(statement);
  requireMemory(code);
  if (code == SQLITE_INTERRUPT) throw timeExpired();
  if (code != SQLITE_ROW || sqlite3_column_type(statement, 0) == SQLITE_NULL) return {};
  const unsigned char* const text = sqlite3_column_text(statement, 0);
  if (text == nullptr) throw std::bad_alloc();
  return reinterpret_cast<const char*>(text);
}

void BackupFile::refuse() const {
  throw sqlFailure(3241, "The media family on device '" + path_ +
                             "' is incorrectly formed. SQL Server cannot process this media family.");
}

int BackupFile::onProgress(void* self) {
  const Deadline& deadline = static_cast<BackupFile*>(self)->deadline_;
  return deadline && std::chrono::steady_clock::now() >= *deadline;
}

}  // namespace QVSa::embedded
