#pragma once

#include <span>
#include <sqlite3.h>
#include <string>
#include <string_view>

#include "providers/embedded/bind/Types.h"
#include "providers/embedded/functions/Decimal.h"
#include "providers/embedded/functions/Functions.h"

namespace QVSa::embedded {

// One call of a function from SQLite. Without a result it gives NULL.
class Call {
 public:
  Call(sqlite3_context* context, int count, sqlite3_value** arguments, const FunctionContext& session)
      : context_(context), count_(count), arguments_(arguments), session_(session) {}

  int count() const { return count_; }
  bool isNull(int i) const { return sqlite3_value_type(arguments_[i]) == SQLITE_NULL; }
  bool anyNull() const;
  std::int64_t whole(int i) const { return sqlite3_value_int64(arguments_[i]); }
  double real(int i) const { return sqlite3_value_double(arguments_[i]); }
  // Throws 824 for bytes that are no decimal.
  Decimal decimal(int i) const;
  std::span<const std::uint8_t> bytes(int i) const;
  // Valid until the call ends.
  std::string_view text(int i) const;
  Value value(int i) const;
  const FunctionContext& session() const { return session_; }

  void give(const Value& value);

 private:
  sqlite3_context* context_;
  int count_;
  sqlite3_value** arguments_;
  const FunctionContext& session_;
};

struct Function {
  const char* name;
  int arguments;  // -1: any number
  void (*body)(Call& call);
  bool sameEachTime = true;  // the same arguments give the same result, whatever the session
};

// t_sum, t_avg and t_single, which gives the one value that there is.
void registerAggregates(sqlite3* handle);

// To be called where an exception was caught in a function of SQLite: nothing may be thrown through its frames.
void keepFailure(sqlite3_context* context, const char* text);

// Every function gives NULL as soon as one argument is NULL; its body is not called.
std::span<const Function> textFunctions();
std::span<const Function> dateFunctions();
std::span<const Function> numberFunctions();

}  // namespace QVSa::embedded
