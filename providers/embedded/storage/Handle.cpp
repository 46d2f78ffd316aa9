#include "providers/embedded/storage/Handle.h"

#include <algorithm>
#include <thread>
#include <unistd.h>

#include "providers/embedded/storage/OpeningFailure.h"
#include "providers/embedded/storage/StorageFailure.h"

namespace QVSa::embedded {

namespace {

using std::chrono::steady_clock;

// How many steps of its machine the library makes between two looks at the clock: some tens of microseconds.
constexpr int stepsBetweenLooks = 1000;
// Opening waits for another process that recovers or checkpoints a file, not for writers.
constexpr std::chrono::seconds openingLimit{15};

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

Handle::Handle(const std::filesystem::path& folder, Unreadable unreadable)
    : folder_(std::filesystem::absolute(folder)),
      process_(::getpid()),
      files_(folder_),
      unreadable_(unreadable),
      random_(std::random_device{}()) {
  try {
    deadline_ = steady_clock::now() + openingLimit;
    open();
    deadline_.reset();
  } catch (...) {
    for (auto& gate : gates_) gate.reset();
    sqlite3_close_v2(handle_);
    throw;
  }
}

Handle::~Handle() {
  attachment_.reset();
  // A forked child has the library's record of its locks but not the locks: even closing could harm the files.
  if (::getpid() != process_) return;
  for (auto* const statement : {&begin_, &commit_, &login_, &version_}) statement->reset();
  for (auto& gate : gates_) gate.reset();
  schemas_.clear();
  sqlite3_close_v2(handle_);
}

void Handle::open() {
  if (const auto failure = missingMaster(folder_)) throw *failure;
  if (const std::string problem = lengthProblem(folder_); !problem.empty())
    throw cannotOpen(folder_, 0, problem, "Move the installation.");
  const std::string master = databaseFile(folder_, databaseNames[0]).string();
  const int flags = SQLITE_OPEN_READWRITE | SQLITE_OPEN_NOMUTEX | SQLITE_OPEN_PRIVATECACHE | SQLITE_OPEN_EXRESCODE;
  const int code = sqlite3_open_v2(master.c_str(), &handle_, flags, nullptr);
  if (handle_ == nullptr) throw std::bad_alloc();
  if (code != SQLITE_OK) throw cannotOpen(folder_, 0, handle_, code);
  configure(handle_);
  sqlite3_busy_handler(handle_, onBusy, this);
  sqlite3_progress_handler(handle_, stepsBetweenLooks, onProgress, this);
  registerFunctions(handle_, context_);
  for (std::size_t i = 0; i < databaseNames.size(); ++i) {
    try {
      attach(i);
    } catch (const Failure& failure) {
      if (i == 0 || !replacesUnreadable()) throw;
      replace(i, failure);
    }
  }
  execute("pragma temp_store=memory");
  mark_.emplace(lockFile(folder_, databaseNames[0]));
}

void Handle::requireOwnProcess() const {
  if (::getpid() != process_) throw usedAfterFork();
}

void Handle::attach(std::size_t database) {
  if (database != 0) attachFile(database);
  check(database);
  const std::string name = databaseNames[database];
  execute("pragma \"" + name + "\".synchronous=full; pragma \"" + name + "\".cache_size=-16000");
  gates_.at(database).emplace(handle_, "delete from \"" + name + "\".gate where 0");
}

void Handle::attachFile(std::size_t database) {
  const std::string file = databaseFile(folder_, databaseNames[database]).string();
  Prepared statement(handle_, std::string("attach ? as \"") + databaseNames[database] + "\"");
  statement.bind(1, file);
  const int code = sqlite3_step(statement.get());
  if (code != SQLITE_DONE) throw cannotOpen(folder_, database, handle_, code);
}

void Handle::replace(std::size_t database, const Failure& reason) {
  const std::string name = databaseNames[database];
  gates_.at(database).reset();
  // A file that could be read but is not the right one is attached.
  sqlite3_exec(handle_, ("detach \"" + name + "\"").c_str(), nullptr, nullptr, nullptr);
  execute("attach ':memory:' as \"" + name + "\"");
  execute("create table \"" + name + "\".engine(layout,catalogue); insert into \"" + name + "\".engine values(" +
          std::to_string(layoutVersion) + ",0); create table \"" + name + "\".gate(n); create table \"" + name +
          "\".definitions(name,text)");
  gates_.at(database).emplace(handle_, "delete from \"" + name + "\".gate where 0");
  replaced_.at(database) = reason;
}

bool Handle::hasReplaced() const {
  return std::ranges::any_of(replaced_, [](const auto& reason) { return reason.has_value(); });
}

void Handle::replaceOutdated(const Failure& reason) {
  for (std::size_t i = 1; i < databaseNames.size(); ++i)
    if (layout(i) != layoutVersion) replace(i, reason);
}

void Handle::check(std::size_t database) {
  const std::string name = databaseNames[database];
  if (readNumber(database, "pragma \"" + name + "\".application_id") != applicationId)
    throw cannotOpen(folder_, database, "the file is no database of this system");
  if (sqlite3_db_readonly(handle_, name.c_str()) == 1) throw cannotOpen(folder_, database, handle_, SQLITE_READONLY);
  const std::int64_t mark = readNumber(database, "pragma \"" + name + "\".user_version");
  const auto other = static_cast<std::size_t>(mark - 1);
  if (mark != 0 && other != database)
    throw cannotOpen(folder_, database,
                     other < databaseNames.size() ? std::string("the file is the one of ") + databaseNames[other]
                                                  : "the file is the one of a database that is not known here");
  isUpToDate_ = requireKnownLayout(database) == layoutVersion && isUpToDate_;
}

int Handle::requireKnownLayout(std::size_t database) {
  const int version = layout(database);
  if (version < 1) throw cannotOpen(folder_, database, "the file has a layout that no release has written");
  if (version > layoutVersion)
    throw cannotOpen(folder_, database,
                     "the file has layout " + std::to_string(version) + ", and this program knows layouts up to " +
                         std::to_string(layoutVersion),
                     "A newer release has to open it.");
  return version;
}

int Handle::layout(std::size_t database) {
  return static_cast<int>(
      readNumber(database, std::string("select layout from \"") + databaseNames[database] + "\".engine"));
}

// The first column of a query's one row, of a file that may be anything.
std::int64_t Handle::readNumber(std::size_t database, const std::string& query) {
  sqlite3_stmt* statement = nullptr;
  int code = sqlite3_prepare_v2(handle_, query.c_str(), -1, &statement, nullptr);
  if (code == SQLITE_OK) code = sqlite3_step(statement);
  const std::int64_t result = code == SQLITE_ROW ? sqlite3_column_int64(statement, 0) : 0;
  sqlite3_finalize(statement);
  if (code != SQLITE_ROW) throw cannotOpen(folder_, database, handle_, code);
  return result;
}

void Handle::stamp(std::size_t database) {
  const std::string name = databaseNames[database];
  execute("update " + name + ".engine set layout=" + std::to_string(layoutVersion) + "; pragma " + name +
          ".user_version=" + std::to_string(database + 1));
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
  Prepared& gate = *gates_.at(database);
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
  if (!isCurrent())
    throw cannotOpen(folder_, 0, "other files have taken the place of those that were opened", "Connect again.");
  const std::int64_t schemas = schemaVersion();
  Prepared& statement = kept(version_,
                             "select m.catalogue+s.catalogue+a.catalogue+u.catalogue,"
                             "max(m.layout,s.layout,a.layout,u.layout) "
                             "from master.engine m, QVSys.engine s, QVApp.engine a, QVUpdate.engine u");
  statement.step();
  const auto version = std::get<std::int64_t>(statement.column(0));
  const auto newestLayout = std::get<std::int64_t>(statement.column(1));
  statement.reset();
  for (std::size_t i = 0; newestLayout > layoutVersion && i < databaseNames.size(); ++i) requireKnownLayout(i);
  return (schemas << definitionBits) + version;
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
    schemas.reserve(databaseNames.size());
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
