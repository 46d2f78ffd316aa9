#include <gtest/gtest.h>

#include "QVSa/frame/KeyedCollection.h"
#include "tests/support/Failures.h"

namespace QVSa {

using test::failureOf;

namespace {

using Names = KeyedCollection<String>;

std::shared_ptr<String> name(const char* text) { return std::make_shared<String>(text); }

}  // namespace

TEST(KeyedCollection, OneRecordUnderTwoKeysLosesTheOneThatIsRemoved) {
  Names names;
  const auto twice = name("twice");
  names.add(twice, "first");
  names.add(twice, "second");
  names.remove("second");
  EXPECT_EQ(*names.at("first"), "twice");
  EXPECT_EQ(failureOf([&] { names.at("second"); }), number::argument);
}

}  // namespace QVSa
