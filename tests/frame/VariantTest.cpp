#include <gtest/gtest.h>

#include "QVSa/values/Variant.h"
#include "tests/support/Failures.h"

namespace QVSa {

using test::failureOf;

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

}  // namespace QVSa
