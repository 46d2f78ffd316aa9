#include <gtest/gtest.h>

#include "QVSa/frame/KeyedCollection.h"
#include "tests/support/Failures.h"

namespace QVSa {

using test::failureOf;

namespace {

using Names = KeyedCollection<String>;

std::shared_ptr<String> name(const char* text) { return std::make_shared<String>(text); }

Names three() {
  Names names;
  names.add(name("one"), "a");
  names.add(name("two"));
  names.add(name("three"), "5");
  return names;
}

}  // namespace

TEST(KeyedCollection, EachWrongIndexFailsInItsOwnWay) {
  Names names = three();
  EXPECT_EQ(failureOf([&] { names.at(0); }), number::position);
  EXPECT_EQ(failureOf([&] { names.remove(4); }), number::position);
  EXPECT_EQ(failureOf([&] { names.at("1"); }), number::argument);
  EXPECT_EQ(failureOf([&] { names.remove(""); }), number::argument);
  EXPECT_EQ(failureOf([&] { names.at(Variant::null()); }), number::type);
  EXPECT_EQ(names.size(), 3U);
  names.remove("a");
  names.add(name("new"), "A");
  EXPECT_EQ(*names.at("a"), "new");
  EXPECT_EQ(*names.at("5"), "three");
}

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
