#include "providers/embedded/session/Session.h"

#include <algorithm>

#include "platform/Services.h"
#include "providers/embedded/bind/Binder.h"
#include "providers/embedded/bind/Literal.h"
#include "providers/embedded/session/Rows.h"
#include "providers/embedded/storage/Definitions.h"
#include "providers/embedded/storage/Savepoint.h"
#include "providers/embedded/storage/StorageFailure.h"
#include "providers/tsql/Parser.h"
#include "providers/tsql/SqlFailure.h"

namespace QVSa::embedded {

// What a handle keeps between sessions: the catalogue, and the plans that were bound against it.
struct EmbeddedSession::Cache {
  std::shared_ptr<const Catalogue> catalogue;
  std::uint64_t mark = 0;                                 // under which the catalogue was found right
  std::array<PlanCache, 2 * databaseNames.size()> plans;  // by current database and whether rows are to be written back
};

namespace {

bool changesNames(const tsql::Statement& statement) {
  return std::holds_alternative<tsql::Use>(statement) || isDefinition(statement);
}

std::pair<std::size_t, std::string> tableKey(const TableInfo& table) { return {table.database, foldName(table.name)}; }

void skipResult(Prepared& statement) {
  while (statement.step()) {
  }
}

Value parameterValue(const Parameter& parameter, const tsql::Token& token) {
  switch (parameter.source) {
    case Parameter::Source::prefixLow:
      return likePrefix(token.text);
    case Parameter::Source::prefixHigh:
      // Nothing that begins with the prefix stands behind it followed by the last character that there is.
      return likePrefix(token.text) + "\xF4\x8F\xBF\xBF";
    default:
      break;
  }
  Value value = literalValue(token, parameter.negate);
  if (!parameter.converted) return value;
  return convert(value, literalType(token), parameter.type, parameter.purpose, parameter.style);
}

std::shared_ptr<const ValueList> listValue(const Parameter& parameter, const tsql::Token& list) {
  auto values = std::make_shared<ValueList>();
  values->reserve(list.items.size());
  for (const auto& item : list.items)
    values->push_back(convert(literalValue(item, false), literalType(item), parameter.type, Purpose::compute));
  return values;
}

// The time that one run may take; 0: any. Fetching rows afterwards, and ending a transaction, have no limit.
class TimeLimit {
 public:
  TimeLimit(Handle& handle, std::chrono::seconds limit) : handle_(handle) {
    if (limit.count() > 0) handle_.deadline(std::chrono::steady_clock::now() + limit);
  }
  ~TimeLimit() { handle_.deadline(std::nullopt); }
  TimeLimit(const TimeLimit&) = delete;
  TimeLimit& operator=(const TimeLimit&) = delete;

 private:
  Handle& handle_;
};

constexpr std::chrono::seconds rowWriteLimit{30};

// What an update that exchanges keys ends with in SQLite.
constexpr Long sameKey = 2627;
constexpr Long sameIndex = 2601;

bool isRollback(const Step& step) {
  const auto* transaction = std::get_if<tsql::Transaction>(&step.control);
  return step.kind == Step::Kind::control && transaction && transaction->kind == tsql::Transaction::Kind::rollback;
}

}  // namespace

EmbeddedSession::EmbeddedSession(PooledHandle handle, std::size_t database, bool administrator)
    : database_(database), administrator_(administrator) {
  useHandle(std::move(handle));
  enter(database_);
  refreshCatalogue();
  cache_->catalogue->requireReadable(database_);
}

void EmbeddedSession::useHandle(PooledHandle handle) {
  handle_ = std::move(handle);
  if (!handle_->attachment()) handle_->attachment() = std::make_shared<Cache>();
  cache_ = std::static_pointer_cast<Cache>(handle_->attachment());
}

EmbeddedSession::~EmbeddedSession() {
  for (auto* rows : rows_) rows->close();
  // What it has defined and not committed is undone now.
  if (change_) cache_->catalogue.reset();
  try {
    endTransaction();
    if (handle_->inTransaction()) handle_->execute("rollback");
  } catch (...) {
    // The pool does not keep a handle whose transaction could not be ended.
  }
}

void EmbeddedSession::refreshCatalogue() {
  const std::uint64_t mark = handle_->mark().value();
  if (cache_->catalogue && cache_->mark == mark && CatalogueMark::isSettled(mark)) return;
  // Who reads already goes on seeing what was there before: the mark says nothing of that.
  const bool readsAlready = sqlite3_txn_state(handle_->get(), nullptr) != SQLITE_TXN_NONE;
  if (!cache_->catalogue || cache_->catalogue->version() != handle_->catalogueVersion()) {
    for (auto& plans : cache_->plans) plans.clear();
    cache_->catalogue = std::make_shared<const Catalogue>(*handle_);
  }
  if (!readsAlready) cache_->mark = mark;
}

template <class Work>
auto EmbeddedSession::guarded(Work work) {
  handle_->requireOwnProcess();
  try {
    auto result = work();
    leaveOthers();
    return result;
  } catch (const Failure& failure) {
    afterFailure(failure.native());
    throw;
  } catch (...) {
    afterFailure(0);
    throw;
  }
}

BatchResult EmbeddedSession::run(const Batch& batch) {
  return guarded([&] {
    const TimeLimit limit(*handle_, batch.timeout);
    return runStatements(batch);
  });
}

BatchResult EmbeddedSession::runStatements(const Batch& batch) {
  const tsql::Deadline deadline(handle_->deadline());
  refreshCatalogue();
  auto tokens = tsql::tokenize(batch.text, deadline);
  const auto plan = planFor(batch, tokens);
  std::vector<tsql::Statement> statements;
  if (!plan) statements = tsql::parse(tokens, deadline);
  std::erase_if(tokens, [](const tsql::Token& token) { return !tsql::isLiteral(token.kind); });
  BatchResult result;
  if (!plan) return runUncached(std::move(statements), batch, tokens);
  for (auto& step : plan->steps) runStep(plan, step, tokens, result);
  return result;
}

std::shared_ptr<Plan> EmbeddedSession::planFor(const Batch& batch, std::vector<tsql::Token>& tokens) {
  PlanCache& plans = cache_->plans[2 * database_ + (batch.updatable ? 1 : 0)];
  const std::string shape = tsql::shapeOf(tokens);
  if (auto known = plans.find(shape, tokens)) return known;
  const tsql::Deadline deadline(handle_->deadline());
  auto statements = tsql::parse(tokens, deadline);
  if (std::ranges::any_of(statements, changesNames)) return nullptr;
  auto plan = std::make_shared<Plan>();
  plan->catalogue = cache_->catalogue;
  LiteralUses uses;
  try {
    for (auto& statement : statements)
      plan->steps.push_back(
          compile(std::move(statement), *plan->catalogue, database_, batch.updatable, deadline, uses));
  } catch (const Failure& failure) {
    // Another session may have made the object since this one looked.
    if (cache_->catalogue->version() == handle_->catalogueVersion()) throw;
    refreshCatalogue();
    return planFor(batch, tokens);
  }
  plans.add(shape, tokens, std::move(uses), plan);
  return plan;
}

BatchResult EmbeddedSession::runUncached(std::vector<tsql::Statement> statements, const Batch& batch,
                                         const std::vector<tsql::Token>& tokens) {
  BatchResult result;
  for (auto& statement : statements) {
    auto plan = std::make_shared<Plan>();
    plan->catalogue = cache_->catalogue;
    LiteralUses uses;
    plan->steps.push_back(compile(std::move(statement), *plan->catalogue, database_, batch.updatable,
                                  tsql::Deadline(handle_->deadline()), uses));
    runStep(plan, plan->steps.front(), tokens, result);
  }
  return result;
}

void EmbeddedSession::runStep(const std::shared_ptr<Plan>& plan, Step& step, const std::vector<tsql::Token>& tokens,
                              BatchResult& result) {
  if (!isRollback(step)) refuseAfterLoss();
  tsql::Deadline(handle_->deadline()).look();
  handle_->context().statementTicks = ticksOf(platform::services().localTime());
  for (const std::size_t database : step.databases) enter(database);
  if (step.kind == Step::Kind::control) return control(step.control);
  if (step.kind != Step::Kind::query) {
    result.affected = write(plan, step, tokens);
    return;
  }
  auto rows = query(plan, step, tokens);
  if (!result.rows) result.rows = std::move(rows);
}

std::unique_ptr<Rows> EmbeddedSession::query(const std::shared_ptr<Plan>& plan, Step& step,
                                             const std::vector<tsql::Token>& tokens) {
  const auto locked = step.candidates ? claimRows(step, tokens) : nullptr;
  Prepared statement = step.main->take(*handle_);
  bind(statement, *step.main, step.parameters, tokens, locked);
  auto rows = std::make_unique<EmbeddedRows>(*this, plan, step, std::move(statement));
  if (locked && !marked_) {
    rows->buffer();
    handle_->locks(step.table->database).release();
  }
  if (started_) settle();
  return rows;
}

void EmbeddedSession::bind(Prepared& statement, const Compiled& compiled, const std::vector<Parameter>& parameters,
                           const std::vector<tsql::Token>& tokens, const std::shared_ptr<const ValueList>& locked) {
  int number = 0;
  for (const std::size_t place : compiled.parameters()) {
    const Parameter& parameter = parameters[place];
    ++number;
    if (parameter.source == Parameter::Source::lockedRows) {
      statement.bind(number, locked);
      continue;
    }
    const tsql::Token& token = parameter.own ? *parameter.own : tokens.at(parameter.literal);
    if (parameter.source == Parameter::Source::list)
      statement.bind(number, listValue(parameter, token));
    else
      statement.bind(number, parameterValue(parameter, token));
  }
}

ValueList EmbeddedSession::candidates(Step& step, const std::vector<tsql::Token>& tokens) {
  Prepared statement = step.candidates->take(*handle_);
  bind(statement, *step.candidates, step.parameters, tokens);
  ValueList keys;
  while (statement.step()) keys.push_back(statement.column(0));
  step.candidates->giveBack(std::move(statement));
  return keys;
}

// The rows that a select with lock hints may give: each is locked first, and the select then reads it again.
std::shared_ptr<const ValueList> EmbeddedSession::claimRows(Step& step, const std::vector<tsql::Token>& tokens) {
  const TableInfo& table = *step.table;
  RowLocks& locks = handle_->locks(table.database);
  const auto taken = [&](std::int64_t row) {
    if (!step.locks) return !locks.othersHold(table.name, row);
    // Who has the write lock is the only one to change rows. One that waits for it may have marked them already.
    return writing_.contains(table.database) ? locks.tryMark(table.name, row) : locks.tryLock(table.name, row);
  };
  auto mine = std::make_shared<ValueList>();
  for (auto& key : candidates(step, tokens)) {
    const std::int64_t row = std::get<std::int64_t>(key);
    bool have = taken(row);
    for (; !have && !step.skips; have = taken(row)) {
      if (started_) giveWriteLockBack();
      handle_->waitShortly();
    }
    if (have)
      mine->push_back(std::move(key));
    else if (marked_)
      passedOver_[tableKey(table)].push_back(std::move(key));
  }
  if (undone_) prepareWrite(table.database);
  std::ranges::sort(*mine);
  return mine;
}

Long EmbeddedSession::write(const std::shared_ptr<Plan>& plan, Step& step, const std::vector<tsql::Token>& tokens) {
  const bool takesIdentity = identityInsert_ == tableKey(*step.table);
  if (step.givesIdentity && !takesIdentity)
    throw tsql::sqlFailure(544, "Cannot insert explicit value for identity column in table '" + step.table->name +
                                    "' when IDENTITY_INSERT is set to OFF.");
  if (step.kind == Step::Kind::insert && !step.givesIdentity && takesIdentity)
    throw tsql::sqlFailure(545, "Explicit value must be specified for identity column in table '" + step.table->name +
                                    "' either when IDENTITY_INSERT is set to ON or when a replication user is "
                                    "inserting into a NOT FOR REPLICATION identity column.");
  const bool inserts = step.kind == Step::Kind::insert;
  if (inserts) refusePassedOver(step, tokens);
  if (!marked_)
    return change({step.table->database, step.table->name, inserts, [&] { return runWrite(step, tokens); }});
  const std::int64_t now = handle_->context().statementTicks;
  return change({step.table->database, step.table->name, inserts, [this, plan, &step, tokens, now] {
                   handle_->context().statementTicks = now;
                   return runWrite(step, tokens);
                 }});
}

Long EmbeddedSession::runWrite(Step& step, const std::vector<tsql::Token>& tokens) {
  if (!step.update) return runOnce(step, tokens);
  try {
    return runOnce(step, tokens);
  } catch (const Failure& failure) {
    if (failure.native() != sameKey && failure.native() != sameIndex) throw;
  }
  return moveKeys(step, tokens);
}

Long EmbeddedSession::runOnce(Step& step, const std::vector<tsql::Token>& tokens) {
  Prepared statement = step.main->take(*handle_);
  bind(statement, *step.main, step.parameters, tokens);
  skipResult(statement);
  const Long changes = static_cast<Long>(sqlite3_changes(handle_->get()));
  step.main->giveBack(std::move(statement));
  if (step.kind == Step::Kind::insert && changes > 0 && step.table->identity) {
    handle_->context().scopeIdentity = sqlite3_last_insert_rowid(handle_->get());
    handle_->context().hasScopeIdentity = true;
  }
  return changes;
}

// SQLite checks keys row by row, the dialect at the end of the statement: a row may get the key of another that gets a
// new one as well. So the new values are read first, then the old ones are replaced by what collides with nothing, then
// the new ones come.
Long EmbeddedSession::moveKeys(Step& step, const std::vector<tsql::Token>& tokens) {
  Binder binder(*cache_->catalogue, database_);
  const Compiled select(emit(*binder.bindNewValues(*step.update)));
  const auto parameters = binder.takeParameters();
  const std::string table = std::string(databaseNames[step.table->database]) + "." + quoteName(step.table->name);
  std::string away, back;
  for (const auto& assignment : step.update->assignments) {
    const std::string column = quoteName(step.table->columns[*step.table->find(assignment.column)].name);
    away += (away.empty() ? "" : ",") + column + "=cast('moved away, row ' || _rowid_ as blob)";
    back += (back.empty() ? "" : ",") + column + "=?";
  }
  Savepoint savepoint(*handle_, step.table->database);
  std::vector<std::vector<Value>> rows;
  Prepared read(handle_->get(), select.text());
  bind(read, select, parameters, tokens);
  while (read.step()) rows.push_back(read.row());
  Prepared moveAway(handle_->get(), "update " + table + " set " + away + " where _rowid_=?");
  for (const auto& row : rows) moveAway.runWith({row.front()});
  Prepared moveBack(handle_->get(), "update " + table + " set " + back + " where _rowid_=?");
  for (auto& row : rows) {
    std::rotate(row.begin(), row.begin() + 1, row.end());
    moveBack.runWith(row);
  }
  savepoint.release();
  return static_cast<Long>(rows.size());
}

// Who passes over a row and then inserts one of its key has collided, and need not wait for the write lock to hear of
// it: whoever holds the row may have that lock for long.
void EmbeddedSession::refusePassedOver(Step& step, const std::vector<tsql::Token>& tokens) {
  const auto passed = passedOver_.find(tableKey(*step.table));
  if (passed == passedOver_.end() || !step.candidates) return;
  for (const Value& key : candidates(step, tokens))
    if (std::ranges::find(passed->second, key) != passed->second.end()) throw duplicateKey(step.table->name);
}

void EmbeddedSession::writeRow(const TableInfo& table, std::int64_t key,
                               const std::vector<std::pair<std::size_t, Value>>& values) {
  std::string text;
  for (const auto& [column, value] : values)
    text += (text.empty() ? "" : ",") + quoteName(table.columns[column].name) + "=?";
  text = std::string("update ") + databaseNames[table.database] + "." + quoteName(table.name) + " set " + text +
         " where _rowid_=?";
  guarded([&] {
    const TimeLimit limit(*handle_, rowWriteLimit);
    refuseAfterLoss();
    enter(table.database);
    return change({table.database, table.name, false, [this, text, key, values] {
                     Prepared statement(handle_->get(), text);
                     int place = 0;
                     for (const auto& [column, value] : values) statement.bind(++place, value);
                     statement.bind(++place, key);
                     skipResult(statement);
                     return static_cast<Long>(sqlite3_changes(handle_->get()));
                   }});
  });
}

void EmbeddedSession::control(const tsql::Statement& statement) {
  if (const auto* option = std::get_if<tsql::SetOption>(&statement)) return setOption(*option);
  if (const auto* transaction = std::get_if<tsql::Transaction>(&statement)) {
    using Kind = tsql::Transaction::Kind;
    if (transaction->kind == Kind::begin && marked_) return static_cast<void>(++inner_);
    if (transaction->kind == Kind::begin) return begin();
    return transaction->kind == Kind::commit ? commit() : rollback();
  }
  if (const auto* named = std::get_if<tsql::Use>(&statement)) return use(named->database);
  if (administer(statement)) return;
  if (const auto* call = std::get_if<tsql::Call>(&statement))
    throw tsql::sqlFailure(2812, "Could not find stored procedure '" + call->procedure.name + "'.");
  defineObject(statement);
}

void EmbeddedSession::use(const std::string& database) {
  const auto found = databaseByName(database);
  if (!found)
    throw tsql::sqlFailure(911,
                           "Database '" + database + "' does not exist. Make sure that the name is entered correctly.");
  enter(*found);
  database_ = *found;
}

void EmbeddedSession::setOption(const tsql::SetOption& option) {
  // Counts are the caller's own business here; every other option than these two is refused by the parser.
  if (option.option != "identity_insert") return;
  const Object object = cache_->catalogue->find(*option.table, database_);
  const auto* table = std::get_if<const TableInfo*>(&object);
  if (!table || !(*table)->identity)
    throw tsql::sqlFailure(8106, "Table '" + option.table->name +
                                     "' does not have the identity property. Cannot perform "
                                     "SET operation.");
  const auto key = tableKey(**table);
  const bool isOther = !identityInsert_.second.empty() && identityInsert_ != key;
  if (option.on && isOther)
    throw tsql::sqlFailure(8107, "IDENTITY_INSERT is already ON for table '" + identityInsert_.second +
                                     "'. Cannot perform SET operation for table '" + option.table->name + "'.");
  if (!isOther) identityInsert_ = option.on ? key : std::pair<std::size_t, std::string>();
}

void EmbeddedSession::defineObject(const tsql::Statement& statement) {
  const bool logins = std::holds_alternative<tsql::CreateLogin>(statement) ||
                      (std::holds_alternative<tsql::Drop>(statement) &&
                       std::get<tsql::Drop>(statement).kind == tsql::Drop::Kind::login);
  if (logins && !administrator_) throw tsql::sqlFailure(229, "User does not have permission to perform this action.");
  const bool own = !marked_;
  if (own) begin();
  try {
    if (!change_) change_.emplace(handle_->mark());
    const std::size_t database = definedDatabase(statement, database_);
    cache_->catalogue->requireReadable(database);
    enter(database);
    prepareWrite(database);
    settle();
    define(*handle_, *cache_->catalogue, database_, statement);
    refreshCatalogue();
    if (own) commit();
  } catch (...) {
    if (own) rollback();
    refreshCatalogue();
    throw;
  }
}

void EmbeddedSession::detach(EmbeddedRows& rows) {
  std::erase(rows_, &rows);
  leaveOthers();
}

void EmbeddedSession::enter(std::size_t database) {
  if (entered_.contains(database)) return;
  RowLocks& locks = handle_->locks(database);
  entered_.insert(database);
  if (locks.tryEnter()) return;
  entered_.erase(database);
  throw tsql::sqlFailure(924, std::string("Database '") + databaseNames[database] +
                                  "' is already open and can only have one user at a time.");
}

// A database that is not the current one is in use while a statement runs there: up to the end of its row set, or of
// the transaction.
void EmbeddedSession::leaveOthers() {
  if (entered_.size() == 1 || marked_) return;
  if (std::ranges::any_of(rows_, [](const EmbeddedRows* rows) { return rows->isStreaming(); })) return;
  std::erase_if(entered_, [this](std::size_t database) {
    if (database == database_) return false;
    handle_->locks(database).leave();
    return true;
  });
}

}  // namespace QVSa::embedded
