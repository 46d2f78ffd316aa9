#include <gtest/gtest.h>

#include "QVSa/frame/Version.h"
#include "tests/support/Failures.h"

namespace QVSa {

TEST(CompareVersion, DecidesAtTheFirstPartThatDiffersOfTwoOrMore) {
  const struct {
    const char *a, *b;
    Integer order;
  } cases[] = {{"8.1", "8.1", 0},   {"8.01", "8.1", 0}, {"8.9", "8.10", 1}, {"9.0", "8.10.7", 2}, {"7.1", "7.1.0", 1},
               {"7.1.0", "7.1", 2}, {"1.x", "1.x", 0},  {"7", "7.1", -1},   {"7.1", "7", -1},     {"", "", -1}};
  for (const auto& [a, b, order] : cases) EXPECT_EQ(compareVersion(a, b), order) << a << " " << b;
  EXPECT_EQ(test::failureOf([] { compareVersion("1.40000", "1.1"); }), number::overflow);
  EXPECT_EQ(test::failureOf([] { compareVersion("1.x", "1.1"); }), number::type);
}

}  // namespace QVSa
