#include "providers/embedded/session/Session.h"

#include <algorithm>

#include "platform/Services.h"
#include "providers/embedded/administration/Upgrade.h"
#include "providers/embedded/bind/Binder.h"
#include "providers/embedded/bind/Literal.h"
#include "providers/embedded/session/Rows.h"
#include "providers/embedded/storage/Definitions.h"
#include "providers/embedded/storage/OpeningFailure.h"
#include "providers/embedded/storage/Savepoint.h"
#include "providers/embedded/storage/StorageFailure.h"
#include "providers/tsql/Parser.h"
#include "providers/tsql/SqlFailure.h"

namespace QVSa::embedded {

namespace {

bool changesNames(const tsql::Statement& statement) {
  return std::holds_alternative<tsql::Use>(statement) || isDefinition(statement);
}

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
    : workspace_(std::move(handle), database),
      transaction_(workspace_),
      administration_(*this, workspace_, transaction_, administrator) {}

EmbeddedSession::~EmbeddedSession() { workspace_.closeRows(); }

void EmbeddedSession::begin() { transaction_.begin(); }
void EmbeddedSession::commit() { transaction_.commit(); }
void EmbeddedSession::rollback() { transaction_.rollback(); }

template <class Work>
auto EmbeddedSession::guarded(Work work) {
  workspace_.handle().requireOwnProcess();
  try {
    auto result = work();
    if (!transaction_.isOpen()) workspace_.leaveOthers();
    return result;
  } catch (const Failure& failure) {
    transaction_.afterFailure(failure.native());
    throw;
  } catch (...) {
    transaction_.afterFailure(0);
    throw;
  }
}

BatchResult EmbeddedSession::run(const Batch& batch) {
  return guarded([&] {
    const TimeLimit limit(workspace_.handle(), batch.timeout);
    return runStatements(batch);
  });
}

BatchResult EmbeddedSession::runStatements(const Batch& batch) {
  const tsql::Deadline deadline(workspace_.handle().deadline());
  workspace_.refreshCatalogue();
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
  PlanCache& plans = workspace_.plans(batch.updatable);
  const std::string shape = tsql::shapeOf(tokens);
  if (auto known = plans.find(shape, tokens)) return known;
  const tsql::Deadline deadline(workspace_.handle().deadline());
  auto statements = tsql::parse(tokens, deadline);
  if (std::ranges::any_of(statements, changesNames)) return nullptr;
  auto plan = std::make_shared<Plan>();
  plan->catalogue = workspace_.catalogue();
  LiteralUses uses;
  try {
    for (auto& statement : statements)
      plan->steps.push_back(
          compile(std::move(statement), *plan->catalogue, workspace_.database(), batch.updatable, deadline, uses));
  } catch (const Failure& failure) {
    // Another session may have made the object since this one looked.
    if (workspace_.catalogue()->version() == workspace_.handle().catalogueVersion()) throw;
    workspace_.refreshCatalogue();
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
    plan->catalogue = workspace_.catalogue();
    LiteralUses uses;
    plan->steps.push_back(compile(std::move(statement), *plan->catalogue, workspace_.database(), batch.updatable,
                                  tsql::Deadline(workspace_.handle().deadline()), uses));
    runStep(plan, plan->steps.front(), tokens, result);
  }
  return result;
}

void EmbeddedSession::runStep(const std::shared_ptr<Plan>& plan, Step& step, const std::vector<tsql::Token>& tokens,
                              BatchResult& result) {
  if (!isRollback(step)) transaction_.refuseAfterLoss();
  tsql::Deadline(workspace_.handle().deadline()).look();
  workspace_.handle().context().statementTicks = ticksOf(platform::services().localTime());
  for (const std::size_t database : step.databases) workspace_.enter(database);
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
  // Each row that a select with lock hints may give is locked first, and the select then reads it again.
  const auto locked =
      step.candidates ? transaction_.claim(*step.table, candidates(step, tokens), step.locks, step.skips) : nullptr;
  Prepared statement = step.main->take(workspace_.handle());
  bind(statement, *step.main, step.parameters, tokens, locked);
  auto rows = std::make_unique<EmbeddedRows>(*this, plan, step, std::move(statement));
  if (locked && !transaction_.isOpen()) {
    rows->buffer();
    workspace_.handle().locks(step.table->database).release();
  }
  transaction_.noteRead();
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
  Prepared statement = step.candidates->take(workspace_.handle());
  bind(statement, *step.candidates, step.parameters, tokens);
  ValueList keys;
  while (statement.step()) keys.push_back(statement.column(0));
  step.candidates->giveBack(std::move(statement));
  return keys;
}

Long EmbeddedSession::write(const std::shared_ptr<Plan>& plan, Step& step, const std::vector<tsql::Token>& tokens) {
  const bool takesIdentity = identityInsert_ == keyOf(*step.table);
  if (step.givesIdentity && !takesIdentity)
    throw tsql::sqlFailure(544, "Cannot insert explicit value for identity column in table '" + step.table->name +
                                    "' when IDENTITY_INSERT is set to OFF.");
  if (step.kind == Step::Kind::insert && !step.givesIdentity && takesIdentity)
    throw tsql::sqlFailure(545, "Explicit value must be specified for identity column in table '" + step.table->name +
                                    "' either when IDENTITY_INSERT is set to ON or when a replication user is "
                                    "inserting into a NOT FOR REPLICATION identity column.");
  const bool inserts = step.kind == Step::Kind::insert;
  if (inserts) refusePassedOver(step, tokens);
  if (!transaction_.isOpen())
    return transaction_.change(
        {step.table->database, step.table->name, inserts, [&] { return runWrite(step, tokens); }});
  const std::int64_t now = workspace_.handle().context().statementTicks;
  return transaction_.change({step.table->database, step.table->name, inserts, [this, plan, &step, tokens, now] {
                                workspace_.handle().context().statementTicks = now;
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
  Prepared statement = step.main->take(workspace_.handle());
  bind(statement, *step.main, step.parameters, tokens);
  skipResult(statement);
  const Long changes = static_cast<Long>(sqlite3_changes(workspace_.handle().get()));
  step.main->giveBack(std::move(statement));
  if (step.kind == Step::Kind::insert && changes > 0 && step.table->identity) {
    workspace_.handle().context().scopeIdentity = sqlite3_last_insert_rowid(workspace_.handle().get());
    workspace_.handle().context().hasScopeIdentity = true;
  }
  return changes;
}

// SQLite checks keys row by row, the dialect at the end of the statement: a row may get the key of another that gets a
// new one as well. So the new values are read first, then the old ones are replaced by what collides with nothing, then
// the new ones come.
Long EmbeddedSession::moveKeys(Step& step, const std::vector<tsql::Token>& tokens) {
  Binder binder(*workspace_.catalogue(), workspace_.database());
  const Compiled select(emit(*binder.bindNewValues(*step.update)));
  const auto parameters = binder.takeParameters();
  const std::string table = std::string(databaseNames[step.table->database]) + "." + quoteName(step.table->name);
  std::string away, back;
  for (const auto& assignment : step.update->assignments) {
    const std::string column = quoteName(step.table->columns[*step.table->find(assignment.column)].name);
    away += (away.empty() ? "" : ",") + column + "=cast('moved away, row ' || _rowid_ as blob)";
    back += (back.empty() ? "" : ",") + column + "=?";
  }
  Savepoint savepoint(workspace_.handle(), step.table->database);
  std::vector<std::vector<Value>> rows;
  Prepared read(workspace_.handle().get(), select.text());
  bind(read, select, parameters, tokens);
  while (read.step()) rows.push_back(read.row());
  Prepared moveAway(workspace_.handle().get(), "update " + table + " set " + away + " where _rowid_=?");
  for (const auto& row : rows) moveAway.runWith({row.front()});
  Prepared moveBack(workspace_.handle().get(), "update " + table + " set " + back + " where _rowid_=?");
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
  const ValueList* const passed = transaction_.passedOver(*step.table);
  if (!passed || !step.candidates) return;
  for (const Value& key : candidates(step, tokens))
    if (std::ranges::find(*passed, key) != passed->end()) throw duplicateKey(step.table->name);
}

void EmbeddedSession::writeRow(const TableInfo& table, std::int64_t key,
                               const std::vector<std::pair<std::size_t, Value>>& values) {
  std::string text;
  for (const auto& [column, value] : values)
    text += (text.empty() ? "" : ",") + quoteName(table.columns[column].name) + "=?";
  text = std::string("update ") + databaseNames[table.database] + "." + quoteName(table.name) + " set " + text +
         " where _rowid_=?";
  guarded([&] {
    const TimeLimit limit(workspace_.handle(), rowWriteLimit);
    transaction_.refuseAfterLoss();
    workspace_.enter(table.database);
    return transaction_.change({table.database, table.name, false, [this, text, key, values] {
                                  Prepared statement(workspace_.handle().get(), text);
                                  int place = 0;
                                  for (const auto& [column, value] : values) statement.bind(++place, value);
                                  statement.bind(++place, key);
                                  skipResult(statement);
                                  return static_cast<Long>(sqlite3_changes(workspace_.handle().get()));
                                }});
  });
}

void EmbeddedSession::control(const tsql::Statement& statement) {
  if (const auto* option = std::get_if<tsql::SetOption>(&statement)) return setOption(*option);
  if (const auto* transaction = std::get_if<tsql::Transaction>(&statement)) {
    using Kind = tsql::Transaction::Kind;
    if (transaction->kind == Kind::begin && transaction_.isOpen()) return transaction_.beginInner();
    if (transaction->kind == Kind::begin) return begin();
    return transaction->kind == Kind::commit ? commit() : rollback();
  }
  if (const auto* named = std::get_if<tsql::Use>(&statement)) return use(named->database);
  if (administration_.run(statement)) return;
  if (const auto* call = std::get_if<tsql::Call>(&statement))
    throw tsql::sqlFailure(2812, "Could not find stored procedure '" + call->procedure.name + "'.");
  defineObject(statement);
}

void EmbeddedSession::use(const std::string& database) {
  const auto found = databaseByName(database);
  if (!found)
    throw tsql::sqlFailure(911,
                           "Database '" + database + "' does not exist. Make sure that the name is entered correctly.");
  workspace_.use(*found);
}

void EmbeddedSession::setOption(const tsql::SetOption& option) {
  // Counts are the caller's own business here; every other option than these two is refused by the parser.
  if (option.option != "identity_insert") return;
  const Object object = workspace_.catalogue()->find(*option.table, workspace_.database());
  const auto* table = std::get_if<const TableInfo*>(&object);
  if (!table || !(*table)->identity)
    throw tsql::sqlFailure(8106, "Table '" + option.table->name +
                                     "' does not have the identity property. Cannot perform "
                                     "SET operation.");
  const auto key = keyOf(**table);
  const bool isOther = !identityInsert_.second.empty() && identityInsert_ != key;
  if (option.on && isOther)
    throw tsql::sqlFailure(8107, "IDENTITY_INSERT is already ON for table '" + identityInsert_.second +
                                     "'. Cannot perform SET operation for table '" + option.table->name + "'.");
  if (!isOther) identityInsert_ = option.on ? key : TableKey();
}

void EmbeddedSession::defineObject(const tsql::Statement& statement) {
  const bool logins = std::holds_alternative<tsql::CreateLogin>(statement) ||
                      std::holds_alternative<tsql::AlterLogin>(statement) ||
                      (std::holds_alternative<tsql::Drop>(statement) &&
                       std::get<tsql::Drop>(statement).kind == tsql::Drop::Kind::login);
  if (logins) administration_.requireAdministrator();
  const bool own = !transaction_.isOpen();
  if (own) begin();
  try {
    transaction_.noteDefinition();
    const std::size_t database = definedDatabase(statement, workspace_.database());
    workspace_.catalogue()->requireReadable(database);
    workspace_.enter(database);
    transaction_.prepareDefinition(database);
    define(workspace_.handle(), *workspace_.catalogue(), workspace_.database(), statement);
    workspace_.refreshCatalogue();
    if (own) commit();
  } catch (...) {
    if (own) rollback();
    workspace_.refreshCatalogue();
    throw;
  }
}

void EmbeddedSession::upgrade(std::size_t database) {
  const std::size_t before = workspace_.database();
  workspace_.use(database);
  try {
    upgradeCurrent();
  } catch (...) {
    workspace_.use(before);
    throw;
  }
  workspace_.use(before);
}

void EmbeddedSession::upgradeCurrent() {
  Handle& handle = workspace_.handle();
  const std::size_t database = workspace_.database();
  const int from = handle.layout(database);
  if (from == layoutVersion) return;
  begin();
  try {
    transaction_.prepareWrite(database);
    for (const auto& batch : upgradeBatches(databaseNames[database], from))
      run({batch, false, std::chrono::seconds(0)});
    handle.stamp(database);
    commit();
  } catch (const Failure& failure) {
    rollback();
    throw cannotOpen(handle.folder(), database,
                     "the file is of an older release, and its upgrade failed: " + failure.description());
  }
}

void EmbeddedSession::detach(EmbeddedRows& rows) {
  workspace_.detach(rows);
  if (!transaction_.isOpen()) workspace_.leaveOthers();
}

}  // namespace QVSa::embedded
