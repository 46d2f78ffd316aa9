#pragma once

#include <array>
#include <chrono>
#include <filesystem>
#include <memory>
#include <optional>
#include <random>
#include <sqlite3.h>
#include <string>
#include <sys/types.h>
#include <vector>

#include "QVSa/values/Failure.h"
#include "providers/embedded/functions/Functions.h"
#include "providers/embedded/storage/CatalogueMark.h"
#include "providers/embedded/storage/InstalledFiles.h"
#include "providers/embedded/storage/Layout.h"
#include "providers/embedded/storage/Prepared.h"
#include "providers/embedded/storage/RowLocks.h"

namespace QVSa::embedded {

// What everything of the engine answers in a process that was forked from one that had used it: SQLite's
// record of its locks is inherited, the locks are not, and even new handles would read mixtures.
Failure usedAfterFork();

// One SQLite connection with all databases of an installation attached under their names, its functions and
// its collation registered: WAL journal, full sync. Waits for the writer with short random sleeps up to the deadline,
// and stops a statement that runs over it.
class Handle {
 public:
  // What becomes of a database other than master that cannot be opened: the handle is not made, or has an empty one in
  // memory in its place.
  enum class Unreadable { refused, replaced };

  // Opens the files of an installation that exists. Throws 17 for a folder that is missing or no installation, 4060 for
  // Opens the files of an installation that exists. Throws 17 for a folder that is missing or no installation, 4060 for
  // a file that is missing, is no database or another one, is damaged, cannot be read or written, has too long a path
  // or a newer layout.
  explicit Handle(const std::filesystem::path& folder, Unreadable unreadable = Unreadable::refused);
  ~Handle();
  Handle(const Handle&) = delete;
  Handle& operator=(const Handle&) = delete;

  const std::filesystem::path& folder() const { return folder_; }
  sqlite3* get() const { return handle_; }
  FunctionContext& context() { return context_; }
  RowLocks& locks(std::size_t database);
  // Takes over the locks that another handle of this installation holds.
  void adoptLocks(Handle& other) { locks_ = std::move(other.locks_); }
  // Lets the row locks on all databases go.
  void releaseLocks();

  // The moment after which a wait ends with SQLITE_BUSY and a running statement with SQLITE_INTERRUPT; none: no limit.
  void deadline(std::optional<std::chrono::steady_clock::time_point> value) { deadline_ = value; }
  std::optional<std::chrono::steady_clock::time_point> deadline() const { return deadline_; }
  bool isLate() const;

  // What the user of the handle keeps with it from session to session. It goes before the handle does.
  std::shared_ptr<void>& attachment() { return attachment_; }

  // Whether databases that cannot be read are replaced, and why this one was.
  bool replacesUnreadable() const { return unreadable_ == Unreadable::replaced; }
  const std::optional<Failure>& whyReplaced(std::size_t database) const { return replaced_.at(database); }
  bool hasReplaced() const;
  // Replaces the databases of an older layout as well: they could not be upgraded, for this reason.
  void replaceOutdated(const Failure& reason);

  // Throws 0x80004005 in a process that was forked from the one that opened the handle.
  void requireOwnProcess() const;
  // Whether the folder still holds the files that this handle has open.
  bool isCurrent() { return files_.areCurrent(); }

  // Sleeps for a moment, random and short. Throws the time-out where the deadline has passed.
  void waitShortly();
  // The layout of a database's file, as it is now.
  int layout(std::size_t database);
  // Whether all files had this build's layout when they were opened.
  bool isUpToDate() const { return isUpToDate_; }
  // Writes this build's layout and the mark of the database into its file.
  void stamp(std::size_t database);

  // Takes the write lock of one database, inside a transaction of the handle: a write that changes nothing.
  void takeWriter(std::size_t database);
  // Begins and ends an SQLite transaction.
  void begin();
  void commit();
  // Runs SQLite statements that give no rows.
  void execute(const std::string& text);
  // Whether an SQLite transaction is open.
  bool inTransaction() const;
  // The stored digest of a log-in's password; empty for a log-in that does not exist.
  std::string loginDigest(const std::string& user);
  // The log-in that was last found right on this handle, and the mark of that moment.
  struct CheckedLogin {
    std::uint64_t mark = 0;
    Bytes fingerprint;
  };
  std::optional<CheckedLogin>& checkedLogin() { return checkedLogin_; }

  const CatalogueMark& mark() const { return *mark_; }
  // As the files tell it. Changes with every definition in any database, by whichever session, and with every restore.
  // What was read under one value is never the truth under it again. Throws 4060 where other files have taken the place
  // of those that the handle has open, or a newer release has changed their layout.
  std::int64_t catalogueVersion();

  // Ends what a session may have left: running statements, a transaction, row locks, its place in the databases, the
  // deadline, the last identity.
  void clear();

 private:
  static int onBusy(void* self, int count);
  static int onProgress(void* self);

  void open();
  void attach(std::size_t database);
  void attachFile(std::size_t database);
  void replace(std::size_t database, const Failure& reason);
  void check(std::size_t database);
  int requireKnownLayout(std::size_t database);
  std::int64_t readNumber(std::size_t database, const std::string& query);
  std::int64_t schemaVersion();
  Prepared& kept(std::optional<Prepared>& statement, const char* text);
  void resetStatements();
  void sleep();

  std::filesystem::path folder_;
  pid_t process_;
  InstalledFiles files_;
  Unreadable unreadable_;
  std::array<std::optional<Failure>, databaseNames.size()> replaced_;
  bool isUpToDate_ = true;
  std::optional<CatalogueMark> mark_;
  sqlite3* handle_ = nullptr;
  FunctionContext context_;
  std::array<std::unique_ptr<RowLocks>, databaseNames.size()> locks_;
  std::array<std::optional<Prepared>, databaseNames.size()> gates_;
  // Statements that every session runs, compiled at their first use.
  std::optional<Prepared> begin_;
  std::optional<Prepared> commit_;
  std::optional<Prepared> login_;
  std::optional<Prepared> version_;
  std::vector<Prepared> schemas_;
  std::shared_ptr<void> attachment_;
  std::optional<CheckedLogin> checkedLogin_;
  std::optional<std::chrono::steady_clock::time_point> deadline_;
  std::minstd_rand random_;
};

}  // namespace QVSa::embedded
