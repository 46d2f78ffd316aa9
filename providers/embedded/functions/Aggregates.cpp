#include <memory>
#include <new>
#include <utility>

#include "providers/embedded/functions/Function.h"
#include "providers/embedded/storage/StorageFailure.h"
#include "providers/embedded/storage/StoredValue.h"
#include "providers/tsql/SqlFailure.h"

namespace QVSa::embedded {

namespace {

// SQLite keeps a pointer a group, null at first; it has no place for one where no row came. It calls `finish` whatever
// happens.
template <class State>
void step(sqlite3_context* context, int, sqlite3_value** arguments) {
  try {
    auto** const state = static_cast<State**>(sqlite3_aggregate_context(context, sizeof(State*)));
    if (state == nullptr) throw std::bad_alloc();
    if (*state == nullptr) *state = new State();
    (*state)->add(arguments[0]);
  } catch (const std::exception& e) {
    keepFailure(context, e.what());
  }
}

template <class State>
void finish(sqlite3_context* context) {
  auto** const place = static_cast<State**>(sqlite3_aggregate_context(context, 0));
  if (place == nullptr || *place == nullptr) return;
  const std::unique_ptr<State> state(std::exchange(*place, nullptr));
  try {
    state->finish(context);
  } catch (const std::exception& e) {
    keepFailure(context, e.what());
  }
}

// A sum of numbers of one kind: whole ones, decimals of one scale, or reals.
class Sum {
 public:
  void add(sqlite3_value* value) {
    const int type = sqlite3_value_type(value);
    if (type == SQLITE_NULL) return;
    kind_ = type;
    ++count_;
    if (type == SQLITE_FLOAT)
      real_ += sqlite3_value_double(value);
    else
      exact_ = requireDigits(exact_ + numberOf(value, type), mostDecimalDigits);
  }

  void finish(sqlite3_context* context) const { give(context, exact_, real_); }

 protected:
  static Decimal numberOf(sqlite3_value* value, int type) {
    if (type == SQLITE_INTEGER) return sqlite3_value_int64(value);
    const Value held = readValue(value);
    const auto* const bytes = std::get_if<Bytes>(&held);
    if (bytes == nullptr || bytes->size() != decimalBytes)
      throw tsql::sqlFailure(824, "The database is damaged: a decimal is none.");
    return decimalFrom(bytes->data());
  }

  void give(sqlite3_context* context, Decimal exact, double real) const {
    if (count_ == 0) return;
    if (kind_ == SQLITE_FLOAT) return giveResult(context, real);
    if (kind_ == SQLITE_BLOB) return giveResult(context, storedDecimal(exact));
    const auto whole = static_cast<std::int64_t>(exact);
    if (whole != exact)
      throw tsql::sqlFailure(8115, "Arithmetic overflow error converting expression to data type bigint.");
    giveResult(context, whole);
  }

  std::int64_t count_ = 0;
  int kind_ = SQLITE_NULL;  // SQLite's type of the values
  Decimal exact_ = 0;
  double real_ = 0;
};

// Of whole numbers and decimals cut, as their division is.
class Average : public Sum {
 public:
  void finish(sqlite3_context* context) const {
    if (count_ > 0) give(context, exact_ / count_, real_ / static_cast<double>(count_));
  }
};

// The one value of a subquery that stands for a value.
class Single {
 public:
  void add(sqlite3_value* next) {
    if (value_)
      throw tsql::sqlFailure(512,
                             "Subquery returned more than 1 value. This is not permitted when the subquery follows =, "
                             "!=, <, <= , >, >= or when the subquery is used as an expression.");
    value_.reset(sqlite3_value_dup(next));
    if (!value_) throw std::bad_alloc();
  }

  void finish(sqlite3_context* context) const { sqlite3_result_value(context, value_.get()); }

 private:
  std::unique_ptr<sqlite3_value, decltype(&sqlite3_value_free)> value_{nullptr, sqlite3_value_free};
};

template <class State>
void add(sqlite3* handle, const char* name) {
  const int flags = SQLITE_UTF8 | SQLITE_INNOCUOUS | SQLITE_DETERMINISTIC;
  const int code =
      sqlite3_create_function_v2(handle, name, 1, flags, nullptr, nullptr, step<State>, finish<State>, nullptr);
  if (code != SQLITE_OK) throwStorageFailure(handle, code);
}

}  // namespace

void registerAggregates(sqlite3* handle) {
  add<Sum>(handle, "t_sum");
  add<Average>(handle, "t_avg");
  add<Single>(handle, "t_single");
}

}  // namespace QVSa::embedded
