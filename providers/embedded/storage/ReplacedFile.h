#pragma once

#include <array>
#include <filesystem>
#include <sqlite3.h>

namespace QVSa::embedded {

// A new file of a database, written beside one that cannot be read, whose place it takes: what stood there is kept
// under a name with ".replaced" and the time. Nobody may use the database meanwhile.
class ReplacedFile {
 public:
  // Throws 823 where it can't be made.
  explicit ReplacedFile(const std::filesystem::path& target);
  // What did not take its place is gone.
  ~ReplacedFile();
  ReplacedFile(const ReplacedFile&) = delete;
  ReplacedFile& operator=(const ReplacedFile&) = delete;

  // The new file, open and empty.
  sqlite3* get() const { return handle_; }
  void takePlace();

 private:
  [[noreturn]] void fail() const;
  void keepOld() const;
  void close();

  std::filesystem::path target_;
  std::filesystem::path beside_;
  // With what SQLite keeps beside it: made before, since what must go has to go without memory.
  std::array<std::filesystem::path, 4> passing_;
  sqlite3* handle_ = nullptr;
};

}  // namespace QVSa::embedded
