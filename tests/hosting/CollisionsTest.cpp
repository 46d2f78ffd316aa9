#include <gtest/gtest.h>

#include "QVSa/hosting/Collisions.h"
#include "QVSa/values/Failure.h"

namespace QVSa::test {
namespace {

TEST(Collision, IsADuplicateKeyInATableOfNumbersOrADeadlock) {
  const String prefix = "Error in creating new table ID.";
  const String violation = "Violation of PRIMARY KEY constraint 'PK_x'. Cannot insert duplicate key in object ";
  for (const char* description :
       {"Violation of PRIMARY KEY constraint. Cannot insert duplicate key in object 'idRec'. (column idRec.idName)",
        "Violation of PRIMARY KEY constraint 'PK__idRec__1'. Cannot insert duplicate key in object 'dbo.idRec'.",
        "Cannot insert duplicate key row in object 'dbo.SysLog' with unique index 'i'.",
        "违反了 PRIMARY KEY 约束“PK_x”。不能在对象'dbo.seslog'中插入重复键。"})
    EXPECT_TRUE(isCollision(number::integrity, prefix + description)) << description;
  for (const String& description :
       {violation + "'dbo.users'. The duplicate key value is ('dbo.idRec').",
        String("Cannot insert the value NULL into column 'logId', table 'QVApp.dbo.syslog'."), violation})
    EXPECT_FALSE(isCollision(number::integrity, description)) << description;
  EXPECT_TRUE(isCollision(number::general, "Transaction (Process ID 5) was deadlocked on lock resources."));
  EXPECT_FALSE(isCollision(number::general, "The server is not reachable."));
  EXPECT_FALSE(isCollision(number::statement, violation + "'dbo.idRec'."));
}

// What an operation reports that failed.
struct Failed {
  Long number;
  Long errNumber() const { return number; }
  String errDescription() const { return "Cannot insert duplicate key in object 'dbo.idRec'."; }
};

TEST(Collision, IsRepeatedAsOftenAsAskedForAndNothingElseIs) {
  for (const auto& [number, failures, expected] :
       {std::tuple{number::integrity, 2, 3}, {number::integrity, 9, 3}, {number::timeout, 9, 1}}) {
    int calls = 0;
    const Repetition thrice(3, std::chrono::milliseconds(0));
    const auto call = [&, last = failures] { return ++calls > last; };
    EXPECT_EQ(repeatCollided(Failed{number}, call, thrice), failures < expected) << failures;
    EXPECT_EQ(calls, expected);
  }
}

}  // namespace
}  // namespace QVSa::test
