#pragma once

#include <sqlite3.h>
#include <string>

#include "QVSa/values/Failure.h"
#include "providers/embedded/functions/Functions.h"
#include "providers/embedded/functions/NumberText.h"
#include "providers/embedded/storage/Prepared.h"

namespace QVSa::embedded {

inline std::string shown(const Value& value) {
  if (const auto* whole = std::get_if<std::int64_t>(&value)) return std::to_string(*whole);
  if (const auto* real = std::get_if<double>(&value)) return decimalText(*real);
  if (const auto* text = std::get_if<std::string>(&value)) return *text;
  return std::holds_alternative<Bytes>(value) ? "bytes" : "NULL";
}

// A handle in memory with the engine's functions.
class ScratchHandle {
 public:
  ScratchHandle() {
    sqlite3_open(":memory:", &handle_);
    sqlite3_extended_result_codes(handle_, 1);
    registerFunctions(handle_, context_);
  }
  ~ScratchHandle() { sqlite3_close(handle_); }
  ScratchHandle(const ScratchHandle&) = delete;
  ScratchHandle& operator=(const ScratchHandle&) = delete;

  sqlite3* get() const { return handle_; }
  FunctionContext& context() { return context_; }
  void run(const std::string& text) { sqlite3_exec(handle_, text.c_str(), nullptr, nullptr, nullptr); }

  // The columns of the first row with "|" between them; "fails N" where it fails with SQL Server's number N.
  std::string ask(const std::string& expressions) {
    try {
      Prepared query(handle_, "select " + expressions);
      std::string row;
      query.step();
      for (int i = 0; i < query.columnCount(); ++i) row += (i == 0 ? "" : "|") + shown(query.column(i));
      return row;
    } catch (const Failure& failure) {
      return "fails " + std::to_string(failure.native());
    }
  }

 private:
  FunctionContext context_;
  sqlite3* handle_ = nullptr;
};

}  // namespace QVSa::embedded
