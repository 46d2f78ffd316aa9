#include "QVSa/frame/Recordset.h"

#include <algorithm>

#include "QVSa/frame/Connection.h"
#include "QVSa/values/Text.h"
#include "providers/Provider.h"

namespace QVSa {

namespace {

Failure noSuchField() {
  return Failure(number::noField, "Recordset",
                 "Item cannot be found in the collection corresponding to the requested name or ordinal.");
}

bool canUpdate(Long cursorType, Long lockType) {
  return (cursorType == adOpenKeyset || cursorType == adOpenDynamic) &&
         (lockType == adLockPessimistic || lockType == adLockOptimistic);
}

}  // namespace

Recordset::Recordset() = default;
Recordset::~Recordset() = default;
Recordset::Recordset(Recordset&& other) noexcept = default;
Recordset& Recordset::operator=(Recordset&& other) noexcept = default;

void Recordset::Open(const String& Source, Connection& ActiveConnection, Long CursorType, Long LockType) {
  if (isOpen()) throw Failure(number::open, "Recordset", "Operation is not allowed when the object is open.");
  if (CursorType != -1) cursorType_ = CursorType;
  if (LockType != -1) lockType_ = LockType;
  const bool updatable = canUpdate(cursorType_, lockType_);
  BatchResult result = ActiveConnection.run(Source, updatable);
  if (!result.rows) return;
  // A dynamic cursor is neither counted nor walked back, so the client keeps nothing of it, however many rows it has.
  const bool atClient = ActiveConnection.CursorLocation() == adUseClient && cursorType_ != adOpenDynamic;
  start(ActiveConnection.attach(std::move(result.rows)), atClient || cursorType_ == adOpenStatic);
  updatable_ = updatable;
}

void Recordset::start(AttachedRows source, bool keep) {
  source_ = std::move(source);
  columns_ = (*source_)->columns();
  asked_.clear();
  kept_.clear();
  changes_.clear();
  chunks_.clear();
  position_ = fetched_ = firstKept_ = turn_ = 0;
  exhausted_ = updatable_ = false;
  keeps_ = keep;
  fetch();
}

void Recordset::Close() {
  requireOpen();
  columns_.clear();
  source_.reset();
  kept_.clear();
}

Long Recordset::State() const { return isOpen() ? 1 : 0; }

void Recordset::CursorType(Long value) { cursorType_ = value; }
void Recordset::LockType(Long value) { lockType_ = value; }

void Recordset::ActiveConnection(std::nullptr_t) {
  requireOpen();
  Update();
  keepFromHere();
  fetchAll();
  source_.reset();
  updatable_ = false;
}

bool Recordset::EOF_() const {
  requireOpen();
  return !isCurrent();
}

void Recordset::MoveNext() {
  requireRow();
  moveTo(position_ + 1);
  if (!isCurrent()) fetch();
}

void Recordset::MoveFirst() {
  requireOpen();
  if (firstKept_ > 0 || (!keeps_ && position_ > 0))
    throw Failure(number::context, "Recordset", "Operation is not allowed in this context.");
  moveTo(0);
  requireRow();
}

void Recordset::MoveLast() {
  requireOpen();
  Update();
  keepFromHere();
  fetchAll();
  moveTo(kept_.empty() ? fetched_ : fetched_ - 1);
  requireRow();
}

Long Recordset::RecordCount() {
  requireOpen();
  if (!keeps_) return -1;
  fetchAll();
  return static_cast<Long>(kept_.size());
}

std::size_t Recordset::fieldCount() const {
  requireOpen();
  return columns_.size();
}

Field Recordset::operator[](std::size_t ordinal) {
  requireOpen();
  if (ordinal >= columns_.size()) throw noSuchField();
  return Field(*this, ordinal);
}

Field Recordset::operator[](int ordinal) {
  if (ordinal < 0) throw noSuchField();
  return (*this)[static_cast<std::size_t>(ordinal)];
}

Field Recordset::operator[](const String& name) {
  requireOpen();
  return Field(*this, ordinalOf(name));
}

Field Recordset::operator[](const char* name) { return (*this)[String(name)]; }

std::vector<std::vector<Variant>> Recordset::GetRows() {
  requireOpen();
  std::vector<Row> all;
  for (; isCurrent(); MoveNext()) all.push_back(keeps_ ? kept_[position_ - firstKept_] : sourceRow());
  return all;
}

void Recordset::Update() {
  requireOpen();
  for (auto& [ordinal, chunks] : chunks_) {
    if (chunks.pending) changes_[ordinal] = Change{chunks.data};
    chunks.pending = false;
  }
  std::vector<std::pair<std::size_t, Variant>> pending;
  for (const auto& [ordinal, change] : changes_) {
    if (change.pending) pending.emplace_back(ordinal, change.value);
  }
  if (pending.empty()) return;
  requireUpdatable();
  source().update(pending);
  for (const auto& [ordinal, value] : pending) settle(ordinal, value);
}

void Recordset::requireOpen() const {
  if (!isOpen()) throw Failure(number::closed, "Recordset", "Operation is not allowed when the object is closed.");
}

void Recordset::requireRow() const {
  requireOpen();
  if (isCurrent()) return;
  throw Failure(number::noRow, "Recordset",
                "Either BOF or EOF is True, or the current record has been deleted. Requested operation requires a "
                "current record.");
}

// The source writes the row on which it stands: the last one that it gave.
void Recordset::requireUpdatable() const {
  requireRow();
  if (updatable_ && position_ + 1 == fetched_ && !exhausted_) return;
  throw Failure(number::readOnly, "Recordset",
                "Current Recordset does not support updating. This may be a limitation of the provider, or of the "
                "selected locktype.");
}

// Row by row the same names are asked for, mostly in the same order: the search begins behind the last one found.
std::size_t Recordset::ordinalOf(const String& name) {
  for (std::size_t tried = 0; tried < asked_.size(); ++tried) {
    if (turn_ == asked_.size()) turn_ = 0;
    const auto& [known, ordinal] = asked_[turn_++];
    if (known == name) return ordinal;
  }
  const auto column =
      std::find_if(columns_.begin(), columns_.end(), [&](const Column& entry) { return sameText(entry.name, name); });
  if (column == columns_.end()) throw noSuchField();
  asked_.emplace_back(name, static_cast<std::size_t>(column - columns_.begin()));
  turn_ = asked_.size();
  return asked_.back().second;
}

bool Recordset::isOpen() const { return !columns_.empty() && (!source_ || *source_); }

Recordset::Row Recordset::sourceRow() const {
  Row row;
  row.reserve(columns_.size());
  for (std::size_t i = 0; i < columns_.size(); ++i) row.push_back(source().value(i));
  return row;
}

bool Recordset::fetch() {
  if (exhausted_) return false;
  if (!source().next()) {
    exhausted_ = true;
    return false;
  }
  if (keeps_) kept_.push_back(sourceRow());
  ++fetched_;
  return true;
}

void Recordset::fetchAll() {
  while (fetch()) {
  }
}

void Recordset::keepFromHere() {
  if (keeps_) return;
  if (isCurrent()) kept_.push_back(sourceRow());
  firstKept_ = position_;
  keeps_ = true;
}

void Recordset::moveTo(std::size_t position) {
  Update();
  changes_.clear();
  chunks_.clear();
  position_ = position;
}

Variant Recordset::valueAt(std::size_t ordinal) const {
  requireRow();
  const auto chunks = chunks_.find(ordinal);
  if (chunks != chunks_.end() && chunks->second.pending) return chunks->second.data;
  const auto change = changes_.find(ordinal);
  if (change != changes_.end()) return change->second.value;
  return keeps_ ? kept_[position_ - firstKept_][ordinal] : source().value(ordinal);
}

void Recordset::change(std::size_t ordinal, const Variant& value) {
  requireUpdatable();
  chunks_.erase(ordinal);
  changes_[ordinal] = Change{value};
}

void Recordset::settle(std::size_t ordinal, const Variant& value) {
  changes_[ordinal].pending = false;
  if (keeps_) kept_[position_ - firstKept_][ordinal] = value;
}

// The value is taken over once a row, since a long one is asked for many times.
Recordset::Chunks& Recordset::chunksOf(std::size_t ordinal) {
  requireRow();
  const auto known = chunks_.find(ordinal);
  if (known != chunks_.end()) return known->second;
  Chunks chunks;
  const Variant value = valueAt(ordinal);
  if (value.isText()) {
    for (const char16_t unit : toUtf16(value.toText())) {
      chunks.data.push_back(static_cast<std::uint8_t>(unit & 0xFF));
      chunks.data.push_back(static_cast<std::uint8_t>(unit >> 8));
    }
  } else if (!value.isNull()) {
    chunks.data = value.toBytes();
  }
  return chunks_.emplace(ordinal, std::move(chunks)).first->second;
}

void Recordset::append(std::size_t ordinal, const Bytes& data) {
  requireUpdatable();
  Chunks& chunks = chunks_[ordinal];
  if (!chunks.pending) chunks = Chunks{{}, 0, true};
  chunks.data.insert(chunks.data.end(), data.begin(), data.end());
}

}  // namespace QVSa
