#pragma once

#include <chrono>
#include <optional>
#include <sqlite3.h>
#include <string>

#include "QVSa/values/Failure.h"
#include "QVSa/values/Values.h"
#include "providers/embedded/functions/Functions.h"

namespace QVSa::embedded {

using Deadline = std::optional<std::chrono::steady_clock::time_point>;

// 3201 for a file that cannot be opened or made, by the system's error number.
Failure cannotOpenDevice(const String& path, int systemError);

// The file of a backup, opened for reading, its form checked: throws 3201 where it cannot be opened, 3241 where it is
// no backup of this engine, 3169 for one of a newer layout.
class BackupFile {
 public:
  BackupFile(const String& path, Deadline deadline);
  ~BackupFile();
  BackupFile(const BackupFile&) = delete;
  BackupFile& operator=(const BackupFile&) = delete;

  sqlite3* get() const { return handle_; }
  // Whether it is a copy of this database, as far as it says so.
  bool isOf(std::size_t database);
  // Reads all of it: the checksum, the structure, and each definition beside the table that it stands for. Throws 3241
  // for a damaged one, the time-out behind the deadline. One without a checksum, as the first release wrote it, gets
  // the rest of the checks and a line in the event log.
  void check();

 private:
  static int onProgress(void* self);

  void open();
  void checkForm();
  int markOfDatabase();
  bool isSummed();
  void checkSum();
  void checkDefinitions();
  std::int64_t sizeOfPages();
  std::int64_t size();
  std::string read(const std::string& query);
  bool isLate() const;
  [[noreturn]] void refuse(const std::string& reason) const;

  String path_;
  Deadline deadline_;
  sqlite3* handle_ = nullptr;
  FunctionContext context_;
};

}  // namespace QVSa::embedded
