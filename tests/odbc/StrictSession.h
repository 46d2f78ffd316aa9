#pragma once

#include <gtest/gtest.h>

#include "providers/odbc/Session.h"

namespace QVSa::odbc {

// A session on a fresh database in memory, behind a driver that answers one statement at a time as SQL Server does.
class StrictSession : public testing::Test {
 protected:
  void SetUp() override {
#ifdef QVSA_STRICT_DRIVER
    session_ = std::make_unique<Session>("Driver={" QVSA_STRICT_DRIVER "};Database=:memory:;StepAPI=Yes;");
#else
    GTEST_SKIP() << "SQLite's ODBC driver is not installed (package libsqliteodbc)";
#endif
  }

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
