#include <gtest/gtest.h>

#include "QVSa/values/Text.h"
#include "tests/support/Failures.h"

namespace QVSa {

using test::failureOf;

TEST(Text, LengthsCountUtf16Units) {
  EXPECT_EQ(textLength("abc"), 3);
  EXPECT_EQ(textLength("部门"), 2);
  EXPECT_EQ(textLength("a😀b"), 4);
  EXPECT_EQ(leftText("部门表", 2), "部门");
  EXPECT_EQ(rightText("部门表", 2), "门表");
  EXPECT_EQ(leftText("a😀b", 3), "a😀");
  EXPECT_EQ(leftText("a😀b", 2), "a\uFFFD");
  EXPECT_EQ(rightText("ab", 9), "ab");
  EXPECT_EQ(leftText("ab", 0), "");
  EXPECT_EQ(failureOf([] { leftText("ab", -1); }), number::argument);
}

TEST(Text, EveryCharacterSurvivesUtf16) {
  for (char32_t c = 1; c <= 0x10FFFF; ++c) {
    if (c >= 0xD800 && c <= 0xDFFF) continue;
    std::u16string units;
    if (c < 0x10000) {
      units.push_back(static_cast<char16_t>(c));
    } else {
      units.push_back(static_cast<char16_t>(0xD800 + (c - 0x10000) / 0x400));
      units.push_back(static_cast<char16_t>(0xDC00 + (c - 0x10000) % 0x400));
    }
    ASSERT_EQ(toUtf16(fromUtf16(units)), units) << static_cast<std::uint32_t>(c);
  }
}

TEST(Text, BrokenBytesReadAsTheReplacementCharacter) {
  for (const char* broken : {"\xFF", "\x80", "\xC0", "\xC3", "\xE4\xB8", "\xC1\x81", "\xE0\x80\x80", "\xED\xA0\x80",
                             "\xF0\x80\x80\x80", "\xF4\x90\x80\x80", "\xF5\x80\x80\x80"}) {
    const std::u16string units = toUtf16(String(broken) + "z");
    EXPECT_EQ(units.front(), 0xFFFD);
    EXPECT_EQ(units.back(), u'z');
    EXPECT_EQ(units.find_first_not_of(u"\uFFFDz"), std::u16string::npos);
  }
  EXPECT_EQ(fromUtf16({0xDC00, u'a', 0xD800}), "\uFFFDa\uFFFD");
}

TEST(Text, CaseIsMappedInEveryScript) {
  EXPECT_EQ(upperCase("az{`"), "AZ{`");
  EXPECT_EQ(lowerCase("AZ[@"), "az[@");
  EXPECT_EQ(upperCase("éжλ部😀"), "ÉЖΛ部😀");
  EXPECT_EQ(lowerCase("ÉЖΛ𐐀"), "éжλ𐐨");
  EXPECT_TRUE(sameText("Отдел", "оТДЕЛ"));
  EXPECT_FALSE(sameText("a", "á"));
}

TEST(Text, OnlyBlanksAreTrimmedAndReplacementIsNotScannedAgain) {
  EXPECT_EQ(trim("  a b  ") + trimLeft("  a ") + trimRight(" a  "), "a ba  a");
  for (const char* other : {"\ta\n", "\u3000a"}) EXPECT_EQ(trim(other), other);
  EXPECT_EQ(replaceAll("aaa", "a", "aa"), "aaaaaa");
  EXPECT_EQ(replaceAll("abc", "", "x"), "abc");
  EXPECT_EQ(split("", ','), std::vector<String>{""});
}

}  // namespace QVSa
