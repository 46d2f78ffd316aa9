#pragma once

#include <gtest/gtest.h>

#include "tests/support/PlainSession.h"
#include "tests/support/TestInstallation.h"

namespace QVSa::test {

// The databases as they are shipped, spoken to in statements.
class Shipped : public testing::Test {
 protected:
  void run(const String& batch, const String& database = "QVSys") { session(database).run(batch); }

  Lines rows(const String& query, const String& database = "QVSys") { return session(database).rows(query); }

 private:
  PlainSession session(const String& database) const { return PlainSession(installation_.server(), database); }

  TestInstallation installation_;
};

}  // namespace QVSa::test
