#include "providers/embedded/Handle.h"

#include <cerrno>
#include <sys/stat.h>
#include <system_error>
#include <thread>
#include <unistd.h>

#include "providers/embedded/StorageFailure.h"
#include "providers/tsql/SqlFailure.h"

namespace QVSa::embedded {

namespace {

using std::chrono::steady_clock;
using tsql::sqlFailure;

// How many steps of its machine the library makes between two looks at the clock: some tens of microseconds.
constexpr int stepsBetweenLooks = 1000;
// Opening waits for another process that recovers or checkpoints a file, not for writers.
constexpr std::chrono::seconds openingLimit{15};

Failure cannotOpen(const std::string& database, const std::string& reason) {
  return sqlFailure(4060, "Cannot open database \"" + database + "\": " + reason + ".");
}

// What a code of the library means while a file is being opened.
std::string openingReason(sqlite3* handle, int code) {
  requireMemory(code);
  const int system = sqlite3_system_errno(handle);
  switch (code & 0xFF) {
    case SQLITE_NOTADB:
      return "the file is no database";
    case SQLITE_CORRUPT:
      return "the file is damaged";
    case SQLITE_READONLY:
      return "the file or its folder is read-only for this user";
    case SQLITE_CANTOPEN:
      return system == 0 ? "the file or its folder cannot be written" : std::generic_category().message(system);
    case SQLITE_BUSY:
      return "another process keeps the file locked";
    default:
      return sqlite3_errmsg(handle);
  }
}

// The first column of a query's one row.
std::int64_t readNumber(sqlite3* handle, const std::string& database, const std::string& query) {
  sqlite3_stmt* statement = nullptr;
  int code = sqlite3_prepare_v2(handle, query.c_str(), -1, &statement, nullptr);
  if (code == SQLITE_OK) code = sqlite3_step(statement);
  const std::int64_t result = code == SQLITE_ROW ? sqlite3_column_int64(statement, 0) : 0;
  sqlite3_finalize(statement);
  if (code == SQLITE_ROW) return result;
  if (code == SQLITE_DONE || code == SQLITE_ERROR) throw cannotOpen(database, "the file is no database of this system");
  throw cannotOpen(database, openingReason(handle, code));
}

void configure(sqlite3* handle) {
  sqlite3_db_config(handle, SQLITE_DBCONFIG_MAINDBNAME, databaseNames[0]);
  sqlite3_db_config(handle, SQLITE_DBCONFIG_TRUSTED_SCHEMA, 0, nullptr);
  // A name in double quotes that is unknown has to fail, not to become a text.
  sqlite3_db_config(handle, SQLITE_DBCONFIG_DQS_DML, 0, nullptr);
  sqlite3_db_config(handle, SQLITE_DBCONFIG_DQS_DDL, 0, nullptr);
}

}  // namespace

Failure usedAfterFork() {
  return Failure(
      number::general, "SQL Server",
      "This process was forked from one that had used the database engine. Start a program of its own instead, "
      "or fork before the first connection.");
}

Handle::Handle(const std::filesystem::path& folder)
    : folder_(std::filesystem::absolute(folder)),
      process_(::getpid()),
      master_(databaseFile(folder_, databaseNames[0])),
      random_(std::random_device{}()) {
  try {
    deadline_ = steady_clock::now() + openingLimit;
    open();
    deadline_.reset();
  } catch (...) {
    gates_.clear();
    schemas_.clear();
    sqlite3_close_v2(handle_);
    throw;
  }
}

Handle::~Handle() {
  attachment_.reset();
  // A forked child has the library's record of its locks but not the locks: even closing could harm the files.
  if (::getpid() != process_) return;
  for (auto* const statement : {&begin_, &commit_, &login_, &version_}) statement->reset();
  gates_.clear();
  schemas_.clear();
  sqlite3_close_v2(handle_);
}

void Handle::open() {
  struct stat file {};
  if (::stat(master_.c_str(), &file) != 0 && (errno == ENOENT || errno == ENOTDIR))
    throw sqlFailure(17, "SQL Server does not exist or access denied.");
  if (const std::string problem = lengthProblem(folder_); !problem.empty()) throw cannotOpen(databaseNames[0], problem);
  masterDevice_ = file.st_dev;
  masterNumber_ = file.st_ino;
  const int flags = SQLITE_OPEN_READWRITE | SQLITE_OPEN_NOMUTEX | SQLITE_OPEN_PRIVATECACHE | SQLITE_OPEN_EXRESCODE;
  const int code = sqlite3_open_v2(master_.c_str(), &handle_, flags, nullptr);
  if (handle_ == nullptr) throw std::bad_alloc();
  if (code != SQLITE_OK) throw cannotOpen(databaseNames[0], openingReason(handle_, code));
  configure(handle_);
  sqlite3_busy_handler(handle_, onBusy, this);
  sqlite3_progress_handler(handle_, stepsBetweenLooks, onProgress, this);
  registerFunctions(handle_, context_);
  for (std::size_t i = 0; i < databaseNames.size(); ++i) attach(i);
  execute("pragma temp_store=memory");
  mark_.emplace(lockFile(folder_, databaseNames[0]));
}

bool Handle::isCurrent() const {
  struct stat file {};
  return ::stat(master_.c_str(), &file) == 0 && file.st_dev == masterDevice_ && file.st_ino == masterNumber_;
}

void Handle::requireOwnProcess() const {
  if (::getpid() != process_) throw usedAfterFork();
}

void Handle::attach(std::size_t database) {
  const std::string name = databaseNames[database];
  if (database != 0) {
    const std::string file = databaseFile(folder_, name).string();
    sqlite3_stmt* statement = nullptr;
    int code = sqlite3_prepare_v2(handle_, ("attach ? as \"" + name + "\"").c_str(), -1, &statement, nullptr);
    if (code != SQLITE_OK) throwStorageFailure(handle_, code);
    code = sqlite3_bind_text(statement, 1, file.c_str(), -1, SQLITE_STATIC);
    if (code == SQLITE_OK) code = sqlite3_step(statement);
    sqlite3_finalize(statement);
    if (code != SQLITE_DONE) throw cannotOpen(name, openingReason(handle_, code));
  }
  check(name);
  execute("pragma \"" + name + "\".synchronous=full; pragma \"" + name + "\".cache_size=-16000");
  gates_.emplace_back(handle_, "delete from \"" + name + "\".gate where 0");
}

void Handle::check(const std::string& database) {
  if (readNumber(handle_, database, "pragma \"" + database + "\".application_id") != applicationId)
    throw cannotOpen(database, "the file is no database of this system");
  if (sqlite3_db_readonly(handle_, database.c_str()) == 1)
    throw cannotOpen(database, "the file or its folder is read-only for this user");
  const std::int64_t layout = readNumber(handle_, database, "select layout from \"" + database + "\".engine");
  if (layout > layoutVersion)
    throw cannotOpen(database, "the file has layout " + std::to_string(layout) + ", this program knows layouts up to " +
                                   std::to_string(layoutVersion) + "; a newer release has to open it");
}

RowLocks& Handle::locks(std::size_t database) {
  auto& locks = locks_.at(database);
  if (!locks) locks = std::make_unique<RowLocks>(lockFile(folder_, databaseNames[database]));
  return *locks;
}

void Handle::releaseLocks() {
  for (auto& locks : locks_)
    if (locks) locks->release();
}

void Handle::waitShortly() {
  if (isLate()) throw timeExpired();
  sleep();
}

void Handle::takeWriter(std::size_t database) {
  Prepared& gate = gates_.at(database);
  gate.step();
  gate.reset();
}

void Handle::execute(const std::string& text) {
  const int code = sqlite3_exec(handle_, text.c_str(), nullptr, nullptr, nullptr);
  if (code != SQLITE_OK) throwStorageFailure(handle_, code);
}

bool Handle::inTransaction() const { return sqlite3_get_autocommit(handle_) == 0; }

Prepared& Handle::kept(std::optional<Prepared>& statement, const char* text) {
  if (!statement) statement.emplace(handle_, text);
  return *statement;
}

void Handle::begin() {
  Prepared& statement = kept(begin_, "begin");
  statement.step();
  statement.reset();
}

void Handle::commit() {
  Prepared& statement = kept(commit_, "commit");
  statement.step();
  statement.reset();
}

// The number of definitions alone would not do: a restored copy brings its own, which may be one that was seen before.
// The library's count of a file's schemas only grows, over a restore too. It is read first: what is loaded after it can
// be newer than the version says, never older.
std::int64_t Handle::catalogueVersion() {
  constexpr int definitionBits = 32;
  const std::int64_t schemas = schemaVersion();
  Prepared& statement = kept(version_,
                             "select m.catalogue+s.catalogue+a.catalogue+u.catalogue "
                             "from master.engine m, QVSys.engine s, QVApp.engine a, QVUpdate.engine u");
  statement.step();
  const Value version = statement.column(0);
  statement.reset();
  return (schemas << definitionBits) + std::get<std::int64_t>(version);
}

std::string Handle::loginDigest(const std::string& user) {
  Prepared& statement = kept(login_, "select digest from master.logins where name=?");
  statement.bind(1, user);
  const Value digest = statement.step() ? statement.column(0) : Value();
  statement.reset();
  const auto* const text = std::get_if<std::string>(&digest);
  return text == nullptr ? std::string() : *text;
}

std::int64_t Handle::schemaVersion() {
  std::int64_t version = 0;
  if (schemas_.empty()) {
    std::vector<Prepared> schemas;
    for (const char* database : databaseNames)
      schemas.emplace_back(handle_, std::string("pragma ") + database + ".schema_version");
    schemas_ = std::move(schemas);
  }
  for (Prepared& schema : schemas_) {
    schema.step();
    version += std::get<std::int64_t>(schema.column(0));
    schema.reset();
  }
  return version;
}

void Handle::resetStatements() {
  for (sqlite3_stmt* statement = nullptr; (statement = sqlite3_next_stmt(handle_, statement)) != nullptr;)
    if (sqlite3_stmt_busy(statement) != 0) sqlite3_reset(statement);
}

void Handle::clear() {
  deadline_.reset();
  if (sqlite3_txn_state(handle_, nullptr) != SQLITE_TXN_NONE) resetStatements();
  if (inTransaction()) execute("rollback");
  releaseLocks();
  for (auto& locks : locks_) {
    if (!locks) continue;
    locks->endAlone();
    locks->leave();
  }
  context_ = {};
}

int Handle::onBusy(void* self, int) {
  Handle& handle = *static_cast<Handle*>(self);
  if (handle.isLate()) return 0;
  handle.sleep();
  return 1;
}

int Handle::onProgress(void* self) { return static_cast<Handle*>(self)->isLate(); }

// With growing sleeps a waiting writer would be overtaken again and again by those who have just come.
void Handle::sleep() {
  std::this_thread::sleep_for(std::chrono::microseconds(std::uniform_int_distribution(200, 1000)(random_)));
}

bool Handle::isLate() const { return deadline_ && steady_clock::now() >= *deadline_; }

}  // namespace QVSa::embedded
