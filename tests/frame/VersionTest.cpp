#include <gtest/gtest.h>

#include "QVSa/frame/Version.h"
#include "tests/support/Failures.h"

namespace QVSa {

using test::failureOf;

TEST(CompareVersion, DecidesAtTheFirstPartThatDiffers) {
  EXPECT_EQ(compareVersion("8.1", "8.1"), 0);
  EXPECT_EQ(compareVersion("8.01", "8.1"), 0);
  EXPECT_EQ(compareVersion("8.9", "8.10"), 1);
  EXPECT_EQ(compareVersion("9.0", "8.10.7"), 2);
  EXPECT_EQ(compareVersion("7.1", "7.1.0"), 1);
  EXPECT_EQ(compareVersion("7.1.0", "7.1"), 2);
}

TEST(CompareVersion, NeedsTwoPartsOfEach) {
  EXPECT_EQ(compareVersion("7", "7.1"), -1);
  EXPECT_EQ(compareVersion("7.1", "7"), -1);
  EXPECT_EQ(compareVersion("", ""), -1);
}

TEST(CompareVersion, PartsAreSixteenBitNumbers) {
  EXPECT_EQ(failureOf([] { compareVersion("1.40000", "1.1"); }), number::overflow);
  EXPECT_EQ(failureOf([] { compareVersion("1.x", "1.1"); }), number::type);
  EXPECT_EQ(compareVersion("1.x", "1.x"), 0);
}

}  // namespace QVSa
