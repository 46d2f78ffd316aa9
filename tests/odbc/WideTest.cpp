#include <gtest/gtest.h>

#include "providers/odbc/Wide.h"

namespace QVSa::odbc {
namespace {

TEST(Wide, KeepsEveryPlaneOfUnicode) {
  const String text = "a\xC3\xA9\xE4\xB8\xAD\xF0\x9F\x98\x80\xF4\x8F\xBF\xBF";
  EXPECT_EQ(toWide(text), u"a\u00E9\u4E2D\U0001F600\U0010FFFF");
  EXPECT_EQ(fromWide(toWide(text)), text);
}

TEST(Wide, PutsAMarkInPlaceOfWhatIsNoText) {
  EXPECT_EQ(toWide("a\xFFz"), u"a\uFFFDz");
  EXPECT_EQ(toWide("a\xE4\xB8"), u"a\uFFFD");        // cut short
  EXPECT_EQ(toWide("\xC0\xAF"), u"\uFFFD\uFFFD");    // an overlong "/"
  EXPECT_EQ(toWide("\xED\xA0\x80"), u"\uFFFD");      // a surrogate
  EXPECT_EQ(toWide("\xF4\x90\x80\x80"), u"\uFFFD");  // above the last code
  const char16_t lone[] = {u'a', 0xD83D, u'z', 0xDE00, 0};
  EXPECT_EQ(fromWide(lone), "a\xEF\xBF\xBDz\xEF\xBF\xBD");
}

}  // namespace
}  // namespace QVSa::odbc
