#pragma once

#include <dlfcn.h>
#include <gtest/gtest.h>

#include "providers/odbc/Pool.h"
#include "providers/odbc/Session.h"

namespace QVSa::odbc {

// A session on a fresh database in memory, behind a driver that answers one statement at a time as SQL Server does.
class StrictSession : public testing::Test {
 protected:
  void SetUp() override {
#ifdef QVSA_STRICT_DRIVER
    session_ = open();
#else
    GTEST_SKIP() << "SQLite's ODBC driver is not installed (package libsqliteodbc)";
#endif
  }
  void TearDown() override {
    session_.reset();
    Pool::instance().clear();
  }

#ifdef QVSA_STRICT_DRIVER
  static std::unique_ptr<Session> open(std::chrono::seconds keep = std::chrono::seconds(0),
                                       const String& identity = "QVUser") {
    return std::make_unique<Session>(Target{"Driver={" QVSA_STRICT_DRIVER "};Database=:memory:;StepAPI=Yes;", "",
                                            "QVSys", "", std::chrono::seconds(15), keep, identity});
  }
  // What the server was asked since the last call.
  static int roundTrips() { return driver<int()>("strictRoundTrips")(); }
  static void loseConnection() { driver<void()>("strictLose")(); }
  template <class Function>
  static Function* driver(const char* name) {
    static void* const library = dlopen(QVSA_STRICT_DRIVER, RTLD_NOW);
    return reinterpret_cast<Function*>(dlsym(library, name));
  }
#else
  static std::unique_ptr<Session> open(std::chrono::seconds = {}, const String& = {}) { return nullptr; }
  static int roundTrips() { return 0; }
  static void loseConnection() {}
#endif

  BatchResult run(const String& text) { return session_->run({text}); }
  std::unique_ptr<QVSa::Rows> rows(const String& text) { return run(text).rows; }

  Variant value(const String& text) {
    const auto found = rows(text);
    EXPECT_TRUE(found->next());
    return found->value(0);
  }

  static String texts(QVSa::Rows& rows) {
    String result;
    while (rows.next()) result += rows.value(0).toText() + " ";
    return result;
  }

  std::unique_ptr<Session> session_;
};

}  // namespace QVSa::odbc
