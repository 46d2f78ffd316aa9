#include "providers/embedded/administration/BackupFile.h"

#include <cerrno>
#include <charconv>
#include <memory>
#include <new>
#include <sys/stat.h>
#include <system_error>
#include <unistd.h>

#include "platform/Files.h"
#include "platform/Services.h"
#include "providers/embedded/administration/BackupTrailer.h"
#include "providers/embedded/storage/Definitions.h"
#include "providers/embedded/storage/Layout.h"
#include "providers/embedded/storage/StorageFailure.h"
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
  if (!S_ISREG(state.st_mode) || state.st_size == 0) refuse("It is no file with something in it.");
  const int flags = SQLITE_OPEN_READONLY | SQLITE_OPEN_NOMUTEX | SQLITE_OPEN_PRIVATECACHE | SQLITE_OPEN_EXRESCODE;
  const int code = sqlite3_open_v2(file.c_str(), &handle_, flags, nullptr);
  requireMemory(code);
  if (code != SQLITE_OK) refuse("It can't be read.");
  sqlite3_db_config(handle_, SQLITE_DBCONFIG_TRUSTED_SCHEMA, 0, nullptr);
  sqlite3_progress_handler(handle_, stepsBetweenLooks, onProgress, this);
  registerFunctions(handle_, context_);
}

// A page of another size would need the file's own pages cut anew, which a restore in one step cannot do.
void BackupFile::checkForm() {
  if (read("pragma application_id") != std::to_string(applicationId) || read("pragma page_size") != pageSize)
    refuse("It is no backup of this system.");
  const int mark = markOfDatabase();
  if (mark < 0 || mark > static_cast<int>(databaseNames.size())) refuse("It is of no database of this system.");
  const int layout = wholeNumber(read("select layout from engine"));
  if (layout < 1) refuse("It has no layout that any release has written.");
  if (layout > layoutVersion)
    throw sqlFailure(3169, "The database was backed up with layout " + std::to_string(layout) +
                               ". This program knows layouts up to " + std::to_string(layoutVersion) +
                               "; a newer release has to restore it.");
}

bool BackupFile::isOf(std::size_t database) {
  const int mark = markOfDatabase();
  return mark == 0 || mark == static_cast<int>(database) + 1;
}

int BackupFile::markOfDatabase() { return wholeNumber(read("pragma user_version")); }

void BackupFile::check() {
  checkSum();
  // To SQLite a page that it has no memory for is damage, too. Such damage is not found twice.
  bool isWhole = false;
  for (int look = 0; look < 2 && !isWhole; ++look) isWhole = read("pragma integrity_check(1)") == "ok";
  if (!isWhole) refuse("Its structure is damaged.");
  checkDefinitions();
  if (!isSummed())
    platform::services().eventLog("The backup '" + path_ +
                                  "' is of an earlier release and has no checksum: damage may go unnoticed.");
}

bool BackupFile::isSummed() { return size() != sizeOfPages(); }

void BackupFile::checkSum() {
  const std::int64_t pages = sizeOfPages();
  const std::int64_t all = size();
  if (all == pages) return;
  if (all != pages + static_cast<std::int64_t>(trailerSize)) refuse("It was cut off, or something was added to it.");
  sqlite3_file* file = nullptr;
  sqlite3_file_control(handle_, "main", SQLITE_FCNTL_FILE_POINTER, &file);
  const auto readBytes = [&](void* bytes, std::size_t count, std::int64_t place) {
    if (isLate()) throw timeExpired();
    if (file->pMethods->xRead(file, bytes, static_cast<int>(count), place) != SQLITE_OK) refuse("It can't be read.");
  };
  Trailer written{};
  readBytes(written.data(), written.size(), pages);
  if (written != trailerOf(readBytes, pages)) refuse("Its checksum is wrong: it is damaged.");
}

// What a copy holds is right in itself or wrong in itself: a definition that does not fit its table would be found out
// only once the copy has taken the place of a database that worked.
void BackupFile::checkDefinitions() {
  try {
    requireFittingDefinitions(handle_);
  } catch (const Failure& failure) {
    if (failure.number() == number::timeout) throw;
    refuse("Its definitions are damaged: " + failure.description());
  }
}

std::int64_t BackupFile::sizeOfPages() {
  return std::int64_t{wholeNumber(read("pragma page_count"))} * wholeNumber(read("pragma page_size"));
}

std::int64_t BackupFile::size() {
  sqlite3_file* file = nullptr;
  sqlite3_file_control(handle_, "main", SQLITE_FCNTL_FILE_POINTER, &file);
  sqlite3_int64 bytes = 0;
  if (file->pMethods->xFileSize(file, &bytes) != SQLITE_OK) refuse("It can't be read.");
  return bytes;
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

bool BackupFile::isLate() const { return deadline_ && std::chrono::steady_clock::now() >= *deadline_; }

void BackupFile::refuse(const std::string& reason) const {
  throw sqlFailure(3241, "The media family on device '" + path_ +
                             "' is incorrectly formed. SQL Server cannot process this media family. " + reason);
}

int BackupFile::onProgress(void* self) { return static_cast<BackupFile*>(self)->isLate(); }

}  // namespace QVSa::embedded
