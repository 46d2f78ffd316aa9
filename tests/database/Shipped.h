#pragma once

#include "tests/support/Scene.h"

namespace QVSa::test {

// The databases as they are shipped, spoken to in statements.
class Shipped : public Scene {
 protected:
  void run(const String& batch, const String& database = "QVSys") { PlainSession(server(), database).run(batch); }

  Lines rows(const String& query, const String& database = "QVSys") {
    return PlainSession(server(), database).rows(query);
  }
};

}  // namespace QVSa::test
