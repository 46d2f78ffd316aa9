#include <gtest/gtest.h>

#include "QVSa/values/Date.h"
#include "QVSa/values/Text.h"
#include "QVSa/values/Variant.h"
#include "tests/support/Failures.h"

namespace QVSa {
namespace {

using test::failureOf;

TEST(Date, CountsDaysFromItsFirstOne) {
  EXPECT_EQ(Date(1899, 12, 30).days(), 0);
  EXPECT_EQ(Date(1900, 1, 1), Date::empty());
  EXPECT_EQ(Date(1900, 3, 1).days(), 61);
  EXPECT_EQ(Date(2012, 4, 1).days(), 41000);
  EXPECT_EQ(Date(100, 1, 1).days(), -657434);
  EXPECT_EQ(Date(9999, 12, 31).days(), 2958465);
}

TEST(Date, EveryDayIsReadBackFromItsParts) {
  Date before(1599, 12, 31);
  const int end = static_cast<int>(Date(2401, 1, 1).days());
  for (int day = static_cast<int>(before.days()) + 1; day < end; ++day) {
    const Date date(static_cast<double>(day));
    ASSERT_EQ(Date(date.year(), date.month(), date.day()), date) << day;
    const bool nextDay = date.day() == before.day() + 1 && date.month() == before.month();
    const bool nextMonth = date.day() == 1 && before.day() >= 28;
    ASSERT_TRUE(nextDay || nextMonth) << day;
    ASSERT_EQ(date.weekday(), before.weekday() % 7 + 1) << day;
    before = date;
  }
  EXPECT_EQ(Date(2024, 2, 29).weekday(), 5);
  EXPECT_EQ(Date(1899, 12, 30).weekday(), 7);
}

TEST(Date, PartsOutsideTheirRangesCarryOver) {
  EXPECT_EQ(Date(2024, 13, 1), Date(2025, 1, 1));
  EXPECT_EQ(Date(2024, 0, 1), Date(2023, 12, 1));
  EXPECT_EQ(Date(2024, 3, 0), Date(2024, 2, 29));
  EXPECT_EQ(Date(2024, 1, 1, 0, 0, -1).text(), "2023-12-31 23:59:59");
  EXPECT_EQ(Date(2024, 1, 1, 49).text(), "2024-01-03 01:00:00");
}

TEST(Date, EverySecondOfADayKeepsItsText) {
  for (int second = 0; second < 86400; ++second) {
    const Date moment(2031, 7, 9, second / 3600, second / 60 % 60, second % 60);
    ASSERT_EQ(moment.hour() * 3600 + moment.minute() * 60 + moment.second(), second);
    ASSERT_EQ(moment.millisecond(), 0);
  }
}

TEST(Date, PartsOfASecondAreCutAndNeverMakeItTheNext) {
  const Date moment = *Date::parse("2024-05-06 10:20:30.999");
  EXPECT_EQ(moment.text(), "2024-05-06 10:20:30");
  EXPECT_EQ(moment.sqlText(), "20240506 10:20:30");
  EXPECT_EQ(moment.millisecond(), 999);
  EXPECT_EQ(Date(45000.99999999999).text(), "2023-03-16 00:00:00");
}

TEST(Date, BeforeDayZeroTheTimeStillRunsForward) {
  EXPECT_EQ(Date(-1.25).text(), "1899-12-29 06:00:00");
  EXPECT_EQ(Date(1899, 12, 29, 6), Date(-1.25));
  EXPECT_EQ(Date(-1.25).dateOnly().text(), "1899-12-29 00:00:00");
  EXPECT_EQ(Date(-1.25).addMonths(1).text(), "1900-01-29 06:00:00");
}

TEST(Date, ABareTimeIsWrittenWithoutADay) {
  EXPECT_EQ(Date::parse("08:30")->text(), "08:30:00");
  EXPECT_EQ(Date::parse("8:30:15")->days(), Date(0.0).days() + (8 * 3600 + 30 * 60 + 15) / 86400.0);
  EXPECT_EQ(Date::parse("08:30")->sqlText(), "18991230 08:30:00");
}

TEST(Date, ReadsItsFormsAndNothingElse) {
  const Date moment(2024, 2, 29, 8, 5, 9);
  for (const char* form : {"2024-02-29 08:05:09", "20240229 08:05:09", "2024-02-29T08:05:09", " 2024-2-29 8:05:09 "})
    EXPECT_EQ(Date::parse(form), moment) << form;
  EXPECT_EQ(Date::parse("20240229"), moment.dateOnly());
  for (const char* form : {"", "  ", "2024", "2023-02-29", "2024-13-01", "2024-00-10", "2024-02-30", "2024-02-29 24:00",
                           "2024-02-29 08:60", "2024-02-29 08:05:09.", "2024-02-29 ab", "2024-02-29 08:05:09 x",
                           "2024-0229", "202402291", "8", "8:5", "29.02.2024", "0099-01-01", "tomorrow"})
    EXPECT_FALSE(Date::parse(form)) << form;
}

TEST(Date, MonthsAreAddedToTheLastDayThatTheTargetHas) {
  EXPECT_EQ(Date(2024, 1, 31, 9, 30).addMonths(1), Date(2024, 2, 29, 9, 30));
  EXPECT_EQ(Date(2024, 3, 31).addMonths(-13), Date(2023, 2, 28));
  EXPECT_EQ(Date(2024, 12, 15).addMonths(1), Date(2025, 1, 15));
}

TEST(Date, OutsideItsYearsItHasNoParts) {
  EXPECT_EQ(failureOf([] { Date(2958466.0).year(); }), number::overflow);
  EXPECT_EQ(failureOf([] { Date(-657435.0).text(); }), number::overflow);
  EXPECT_EQ(failureOf([] { Date(9999, 12, 1).addMonths(1).sqlText(); }), number::overflow);
}

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

TEST(Variant, NumbersRoundHalfToEvenAndKeepToTheirRange) {
  EXPECT_EQ(Variant(2.5).toLong(), 2);
  EXPECT_EQ(Variant(3.5).toLong(), 4);
  EXPECT_EQ(Variant(" -1.5e1 ").toLong(), -15);
  EXPECT_EQ(Variant("32767.4").toInteger(), 32767);
  EXPECT_EQ(failureOf([] { Variant("32767.5").toInteger(); }), number::overflow);
  EXPECT_EQ(failureOf([] { Variant(2147483648.0).toLong(); }), number::overflow);
  EXPECT_EQ(failureOf([] { Variant("1e999").toDouble(); }), number::overflow);
}

TEST(Variant, TextsOfOtherFormsAreNoNumbers) {
  for (const char* text : {"0", "-7", "+7", "1.", ".5", "1e5", "1.5E-3", "  42  "})
    EXPECT_TRUE(Variant(text).isNumeric()) << text;
  for (const char* text :
       {"", " ", "-", ".", "e5", "1e", "1e+", "1,000", "0x1F", "$5", "1 2", "inf", "nan", "--1", "5d"}) {
    EXPECT_FALSE(Variant(text).isNumeric()) << text;
    EXPECT_EQ(failureOf([&] { Variant(text).toDouble(); }), number::type) << text;
  }
  EXPECT_FALSE(Variant().isNumeric());
  EXPECT_FALSE(Variant::null().isNumeric());
  EXPECT_FALSE(Variant(Date(2.0)).isNumeric());
  EXPECT_TRUE(Variant(false).isNumeric());
}

TEST(Variant, EmptyIsNothingAndNullIsNoValueAtAll) {
  EXPECT_EQ(Variant().toLong(), 0);
  EXPECT_EQ(Variant().toText(), "");
  EXPECT_FALSE(Variant().toBoolean());
  for (const auto read : {+[](const Variant& v) { v.toLong(); }, +[](const Variant& v) { v.toText(); },
                          +[](const Variant& v) { v.toDate(); }, +[](const Variant& v) { v.toBytes(); }})
    EXPECT_EQ(failureOf([&] { read(Variant::null()); }), number::nullUse);
}

TEST(Variant, TrueIsMinusOneAndAnyNumberButZeroIsTrue) {
  EXPECT_EQ(Variant(true).toLong(), -1);
  EXPECT_EQ(Variant(true).toText(), "-1");
  EXPECT_EQ(Variant(false).toText(), "0");
  EXPECT_TRUE(Variant(0.5).toBoolean());
  EXPECT_TRUE(Variant("TRUE").toBoolean());
  EXPECT_FALSE(Variant("False").toBoolean());
  EXPECT_FALSE(Variant("0").toBoolean());
  EXPECT_EQ(failureOf([] { Variant("yes").toBoolean(); }), number::type);
}

TEST(Variant, ANumbersTextIsTheShortestOfFifteenDigits) {
  const std::pair<double, const char*> cases[] = {{0.1, "0.1"},
                                                  {5.0, "5"},
                                                  {-0.0, "0"},
                                                  {-12.5, "-12.5"},
                                                  {100, "100"},
                                                  {0.1 + 0.2, "0.3"},
                                                  {1.0 / 3, "0.333333333333333"},
                                                  {1.0 / 300, "3.33333333333333E-03"},
                                                  {0.00001, "0.00001"},
                                                  {123456789012345, "123456789012345"},
                                                  {1e15, "1E+15"},
                                                  {1e20, "1E+20"},
                                                  {-1.5e-20, "-1.5E-20"},
                                                  {1e100, "1E+100"}};
  for (const auto& [value, text] : cases) EXPECT_EQ(Variant(value).toText(), text);
  EXPECT_EQ(Variant(Long{-2147483647 - 1}).toText(), "-2147483648");
}

TEST(Variant, DatesAndBytesComeFromWhatReadsAsThem) {
  EXPECT_EQ(Variant("2024-02-29").toDate(), Date(2024, 2, 29));
  EXPECT_EQ(Variant(2.0).toDate(), Date::empty());
  EXPECT_EQ(Variant(Date(2024, 2, 29)).toText(), "2024-02-29 00:00:00");
  EXPECT_EQ(failureOf([] { Variant("soon").toDate(); }), number::type);
  EXPECT_EQ(Variant("ab").toBytes(), (Bytes{'a', 'b'}));
  EXPECT_EQ(failureOf([] { Variant(5).toBytes(); }), number::type);
  EXPECT_EQ(failureOf([] { Variant(Bytes{1}).toText(); }), number::type);
}

}  // namespace
}  // namespace QVSa
