#include "providers/embedded/session/Plan.h"

#include <algorithm>

#include "providers/embedded/bind/Binder.h"
#include "providers/embedded/bind/Emitter.h"
#include "providers/embedded/bind/Literal.h"
#include "providers/embedded/bind/PushDown.h"
#include "providers/tsql/OuterJoins.h"

namespace QVSa::embedded {

namespace {

// More than the library's own statements have shapes; a host that writes endless ones starts over.
constexpr std::size_t cacheLimit = 1000;

void setColumns(Step& step, const BoundSelect& select) {
  for (const auto& item : select.parts.front().core.items) {
    const Type& type = item.expression->type;
    step.columns.push_back({item.name, type.base == Base::ntext || type.base == Base::image});
    step.results.push_back({type, item.tableColumn});
  }
}

void setClaim(Step& step, const RowClaim& claim) {
  step.table = claim.table;
  step.locks = claim.lock;
  step.skips = claim.skip;
  step.candidates = std::make_unique<Compiled>(emit(*claim.candidates));
}

Step compileQuery(const tsql::Select& select, Binder& binder, bool updatable) {
  Step step;
  step.kind = Step::Kind::query;
  const BoundQuery query = binder.bindQuery(select, updatable);
  pushDown(*query.select);
  step.main = std::make_unique<Compiled>(emit(*query.select));
  setColumns(step, *query.select);
  if (query.claim) setClaim(step, *query.claim);
  if (query.updatable) {
    step.table = query.updatable;
    step.updatable = true;
    step.columns.pop_back();
    step.results.pop_back();
  }
  return step;
}

Step compileInsert(const tsql::Insert& insert, Binder& binder) {
  Step step;
  step.kind = Step::Kind::insert;
  const BoundInsert bound = binder.bindInsert(insert);
  step.table = bound.table;
  step.givesIdentity = bound.givesIdentity;
  step.main = std::make_unique<Compiled>(emit(bound));
  if (auto twins = emitTwins(bound)) step.candidates = std::make_unique<Compiled>(std::move(*twins));
  return step;
}

template <class BoundWrite>
Step compileWrite(const BoundWrite& bound) {
  Step step;
  step.kind = Step::Kind::write;
  step.table = bound.table;
  step.main = std::make_unique<Compiled>(emit(bound));
  return step;
}

Step compileStatement(tsql::Statement& statement, Binder& binder, bool updatable) {
  if (const auto* select = std::get_if<tsql::SelectPtr>(&statement)) return compileQuery(**select, binder, updatable);
  if (const auto* insert = std::get_if<tsql::Insert>(&statement)) return compileInsert(*insert, binder);
  if (auto* update = std::get_if<tsql::Update>(&statement)) {
    Step step = compileWrite(binder.bindUpdate(*update));
    step.update = std::move(*update);
    return step;
  }
  if (const auto* erase = std::get_if<tsql::Delete>(&statement)) return compileWrite(binder.bindDelete(*erase));
  Step step;
  step.control = std::move(statement);
  return step;
}

// A literal that is used in several ways counts by the one that asks for most.
void setUses(const Step& step, const std::vector<std::size_t>& patterns, LiteralUses& uses) {
  const auto isOfBatch = [](const Parameter& parameter) {
    return !parameter.own && parameter.source != Parameter::Source::lockedRows;
  };
  const auto set = [&](std::size_t literal, LiteralUse use) {
    if (literal >= uses.size()) uses.resize(literal + 1, LiteralUse::value);
    uses[literal] = use;
  };
  for (const auto& parameter : step.parameters)
    if (isOfBatch(parameter)) set(parameter.literal, LiteralUse::none);
  for (const std::size_t pattern : patterns) set(pattern, LiteralUse::pattern);
  for (const auto& parameter : step.parameters)
    if (isOfBatch(parameter) && parameter.structural) set(parameter.literal, LiteralUse::value);
}

}  // namespace

Prepared Compiled::take(Handle& handle) {
  if (!idle_.empty()) {
    Prepared statement = std::move(idle_.back());
    idle_.pop_back();
    return statement;
  }
  return Prepared(handle.get(), emitted_.text);
}

void Compiled::giveBack(Prepared statement) noexcept {
  statement.reset();
  try {
    idle_.push_back(std::move(statement));
  } catch (const std::bad_alloc&) {
    // The next run compiles it again.
  }
}

Step compile(tsql::Statement statement, const Catalogue& catalogue, std::size_t database, bool updatable,
             tsql::Deadline deadline, LiteralUses& uses) {
  tsql::rewriteOuterJoins(statement);
  Binder binder(catalogue, database, deadline);
  Step step = compileStatement(statement, binder, updatable);
  if (step.main) step.databases = step.main->databases();
  step.parameters = binder.takeParameters();
  setUses(step, binder.takePatterns(), uses);
  return step;
}

std::string PlanCache::variant(const LiteralUses& uses, const std::vector<tsql::Token>& tokens) {
  std::string text;
  for (const auto& token : tokens) {
    if (!tsql::isLiteral(token.kind)) continue;
    const LiteralUse use = token.literal < uses.size() ? uses[token.literal] : LiteralUse::value;
    if (use == LiteralUse::value) text += std::to_string(token.text.size()) + ":" + token.text;
    if (use == LiteralUse::pattern) text += likePrefix(token.text).empty() ? '%' : 'p';
  }
  return text;
}

std::shared_ptr<Plan> PlanCache::find(const std::string& shape, const std::vector<tsql::Token>& tokens) const {
  const auto known = shapes_.find(shape);
  if (known == shapes_.end()) return nullptr;
  const auto plan = known->second.plans.find(variant(known->second.uses, tokens));
  return plan == known->second.plans.end() ? nullptr : plan->second;
}

void PlanCache::add(const std::string& shape, const std::vector<tsql::Token>& tokens, LiteralUses uses,
                    std::shared_ptr<Plan> plan) {
  if (++size_ > cacheLimit) {
    shapes_.clear();
    size_ = 1;
  }
  Shape& known = shapes_[shape];
  if (known.plans.empty()) known.uses = std::move(uses);
  known.plans[variant(known.uses, tokens)] = std::move(plan);
}

}  // namespace QVSa::embedded
