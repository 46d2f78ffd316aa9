#include "providers/embedded/functions/Functions.h"

#include <exception>
#include <memory>
#include <utility>

#include "providers/embedded/functions/Collation.h"
#include "providers/embedded/functions/Conversions.h"
#include "providers/embedded/functions/Decimal.h"
#include "providers/embedded/functions/Function.h"
#include "providers/embedded/functions/ListTable.h"
#include "providers/embedded/storage/StorageFailure.h"
#include "providers/embedded/storage/StoredValue.h"
#include "providers/tsql/SqlFailure.h"

namespace QVSa::embedded {

namespace {

// A result code of our own: the step failed for the exception that is kept here, on the thread that ran it.
constexpr int functionFailed = SQLITE_ERROR | (0x7F << 8);
thread_local std::exception_ptr keptFailure;

struct Registered {
  const Function* function;
  FunctionContext* session;
};

void run(sqlite3_context* context, int count, sqlite3_value** arguments) {
  const auto* const registered = static_cast<const Registered*>(sqlite3_user_data(context));
  try {
    Call call(context, count, arguments, *registered->session);
    if (!call.anyNull()) registered->function->body(call);
  } catch (const std::exception& e) {
    keepFailure(context, e.what());
  }
}

void convertValue(Call& call) {
  call.give(convert(call.value(0), typeOfCode(call.whole(1)), typeOfCode(call.whole(2)),
                    static_cast<Purpose>(call.whole(3)), static_cast<int>(call.whole(4))));
}

void scopeIdentity(Call& call) {
  if (call.session().hasScopeIdentity) call.give(storedDecimal(call.session().scopeIdentity));
}

void refuseNoIdentity(Call&) {
  throw tsql::sqlFailure(339, "DEFAULT or NULL are not allowed as explicit identity values.");
}

constexpr Function sessionFunctions[] = {{"t_no_identity", 0, refuseNoIdentity, false},
                                         {"t_convert", 5, convertValue},
                                         {"t_scope_identity", 0, scopeIdentity, false}};

void registerAll(sqlite3* handle, FunctionContext& session, std::span<const Function> functions) {
  const auto destroy = [](void* registered) { delete static_cast<Registered*>(registered); };
  for (const Function& function : functions) {
    const int flags = SQLITE_UTF8 | SQLITE_INNOCUOUS | (function.sameEachTime ? SQLITE_DETERMINISTIC : 0);
    auto registered = std::make_unique<Registered>(Registered{&function, &session});
    // The library destroys the client data where it fails, too.
    const int code = sqlite3_create_function_v2(handle, function.name, function.arguments, flags, registered.release(),
                                                run, nullptr, nullptr, destroy);
    if (code != SQLITE_OK) throwStorageFailure(handle, code);
  }
}

}  // namespace

void keepFailure(sqlite3_context* context, const char* text) {
  keptFailure = std::current_exception();
  sqlite3_result_error(context, text, -1);
  sqlite3_result_error_code(context, functionFailed);
}

bool Call::anyNull() const {
  for (int i = 0; i < count_; ++i)
    if (isNull(i)) return true;
  return false;
}

std::string_view Call::text(int i) const {
  const unsigned char* const text = sqlite3_value_text(arguments_[i]);
  if (text == nullptr) throw std::bad_alloc();
  return {reinterpret_cast<const char*>(text), static_cast<std::size_t>(sqlite3_value_bytes(arguments_[i]))};
}

std::span<const std::uint8_t> Call::bytes(int i) const {
  const void* const bytes = sqlite3_value_blob(arguments_[i]);
  return {static_cast<const std::uint8_t*>(bytes), static_cast<std::size_t>(sqlite3_value_bytes(arguments_[i]))};
}

Decimal Call::decimal(int i) const {
  const auto stored = bytes(i);
  if (stored.size() != decimalBytes) throw tsql::sqlFailure(824, "The database is damaged: a decimal is none.");
  return decimalFrom(stored.data());
}

Value Call::value(int i) const { return readValue(arguments_[i]); }

void Call::give(const Value& value) { giveResult(context_, value); }

void registerFunctions(sqlite3* handle, FunctionContext& context) {
  registerCollation(handle);
  registerAll(handle, context, sessionFunctions);
  registerAll(handle, context, textFunctions());
  registerAll(handle, context, dateFunctions());
  registerAll(handle, context, numberFunctions());
  registerAggregates(handle);
  registerListTable(handle);
}

void rethrowFailure(sqlite3* handle) {
  if (sqlite3_extended_errcode(handle) != functionFailed || !keptFailure) return;
  std::rethrow_exception(std::exchange(keptFailure, nullptr));
}

}  // namespace QVSa::embedded
