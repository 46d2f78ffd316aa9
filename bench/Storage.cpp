#include "bench/Storage.h"

#include <ctime>
#include <stdexcept>

#include "providers/embedded/functions/Collation.h"
#include "providers/embedded/storage/Layout.h"

namespace QVSa::bench {

namespace {

void require(bool good, sqlite3* handle) {
  if (!good) throw std::runtime_error(sqlite3_errmsg(handle));
}

}  // namespace

Storage::Storage(const std::filesystem::path& folder) {
  const auto file = [&](const char* name) { return embedded::databaseFile(folder, name).string(); };
  const int flags = SQLITE_OPEN_READWRITE | SQLITE_OPEN_NOMUTEX | SQLITE_OPEN_PRIVATECACHE;
  require(sqlite3_open_v2(file(embedded::databaseNames[0]).c_str(), &handle_, flags, nullptr) == SQLITE_OK, handle_);
  embedded::registerCollation(handle_);
  for (const char* const name : {"QVSys", "QVApp"}) {
    execute("attach '" + file(name) + "' as " + name);
    execute(std::string("pragma ") + name + ".synchronous=full; pragma " + name + ".cache_size=-16000");
  }
  sqlite3_busy_timeout(handle_, 10'000);
}

Storage::~Storage() { sqlite3_close_v2(handle_); }

void Storage::execute(const std::string& text) {
  require(sqlite3_exec(handle_, text.c_str(), nullptr, nullptr, nullptr) == SQLITE_OK, handle_);
}

Query::Query(const Storage& storage, const std::string& text) {
  require(
      sqlite3_prepare_v3(storage.get(), text.c_str(), -1, SQLITE_PREPARE_PERSISTENT, &statement_, nullptr) == SQLITE_OK,
      storage.get());
}

Query::~Query() { sqlite3_finalize(statement_); }

bool Query::step() {
  const int code = sqlite3_step(statement_);
  if (code == SQLITE_DONE) sqlite3_reset(statement_);
  require(code == SQLITE_ROW || code == SQLITE_DONE, sqlite3_db_handle(statement_));
  return code == SQLITE_ROW;
}

void Query::run() {
  while (step()) continue;
}

Row Query::one() {
  if (!step()) throw std::runtime_error("The floor did not find its row.");
  Row found = row();
  sqlite3_reset(statement_);
  return found;
}

Row Query::row() const {
  Row row;
  const int columns = sqlite3_column_count(statement_);
  row.texts.reserve(static_cast<std::size_t>(columns));
  row.numbers.reserve(static_cast<std::size_t>(columns));
  for (int i = 0; i < columns; ++i) {
    if (sqlite3_column_type(statement_, i) == SQLITE_INTEGER) {
      row.numbers.push_back(sqlite3_column_int64(statement_, i));
    } else {
      const auto* const text = reinterpret_cast<const char*>(sqlite3_column_text(statement_, i));
      const auto size = static_cast<std::size_t>(sqlite3_column_bytes(statement_, i));
      row.texts.emplace_back(text == nullptr ? "" : text, size);
    }
  }
  return row;
}

void Query::bind(int place, std::string_view text) {
  sqlite3_bind_text(statement_, place, text.data(), static_cast<int>(text.size()), SQLITE_STATIC);
}

void Query::bind(int place, std::int64_t number) { sqlite3_bind_int64(statement_, place, number); }

std::int64_t nowTicks() {
  constexpr std::int64_t daysTo1970 = 25'567;
  const std::time_t now = std::time(nullptr);
  std::tm local{};
  localtime_r(&now, &local);
  return daysTo1970 * ticksPerDay + 300 * (static_cast<std::int64_t>(now) + local.tm_gmtoff);
}

}  // namespace QVSa::bench
