#include <gtest/gtest.h>

#include "QVSa/hosting/SafeTexts.h"

namespace QVSa::test {
namespace {

TEST(SafeTexts, HoldNothingThatEndsALiteralOrAName) {
  EXPECT_EQ(idList({3, -17}) + idList({}), "3,-17");
  EXPECT_EQ(idPairs({{1, 2}, {3, 4}}), "1,2|3,4");
  EXPECT_TRUE(isPlainPath("D:\\back ups\\ünter"));
  for (const String& path : {String("it's"), String("a\nb"), String("a\0b", 3)}) EXPECT_FALSE(isPlainPath(path));
  EXPECT_TRUE(isPlainName("QVApp_2") && isPlainName("") && isPlainName("数据库"));
  for (const char* name : {"QVApp;uid=sa", "QVApp drop", "[x]", "it's"}) EXPECT_FALSE(isPlainName(name)) << name;
}

}  // namespace
}  // namespace QVSa::test
