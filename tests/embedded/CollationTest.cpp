#include <algorithm>
#include <gtest/gtest.h>
#include <random>
#include <vector>

#include "providers/embedded/functions/Collation.h"
#include "providers/embedded/functions/Utf8.h"

namespace QVSa::embedded {
namespace {

TEST(Collation, CaseAndTrailingBlanksDoNotCount) {
  EXPECT_EQ(compareText("Sales", "sALES  "), 0);
  EXPECT_EQ(compareText("", "   "), 0);
  EXPECT_EQ(compareText("ÄÖÜ Ж Ω", "äöü ж ω"), 0);
  EXPECT_EQ(compareText("ΣΑΣ", "σας"), 0);
  EXPECT_EQ(compareText("\u212A", "k"), 0);  // the Kelvin sign
  EXPECT_NE(compareText(" Sales", "Sales"), 0);
  EXPECT_NE(compareText("Sales\t", "Sales"), 0);
  EXPECT_NE(compareText("resume", "résumé"), 0);
}

TEST(Collation, LettersWithoutAPartnerOfTheSameLengthStayThemselves) {
  EXPECT_NE(compareText("I", "ı"), 0);
  EXPECT_NE(compareText("i", "İ"), 0);
  EXPECT_NE(compareText("ß", "ss"), 0);
  EXPECT_EQ(compareText("ẞ", "ß"), 0);
}

TEST(Collation, TheOrderIsThatOfCodePointsAndTheShorterComesFirst) {
  std::vector<std::string> texts = {"😀", "部门", "\uFF21", "b", "Äpfel", "ab", "a", "_root", "部", "Zeta", "A b"};
  std::sort(texts.begin(), texts.end(), [](const auto& a, const auto& b) { return compareText(a, b) < 0; });
  const std::vector<std::string> expected = {"_root", "a",  "A b",  "ab",     "b", "Zeta",
                                             "Äpfel", "部", "部门", "\uFF21", "😀"};
  EXPECT_EQ(texts, expected);
}

// An index over an order that contradicts itself loses rows, so that any bytes at all have to have their place.
TEST(Collation, AnyBytesHaveOnePlaceInTheOrder) {
  static constexpr std::string_view pieces[] = {"a",
                                                "A",
                                                "b",
                                                " ",
                                                "é",
                                                "É",
                                                "部",
                                                "😀",
                                                "\x80",
                                                "\xFF",
                                                "\xE9\x83",
                                                "\xF0\x9F",
                                                "\xC0\x80",
                                                "\xED\xA0\x80",
                                                "\xF4\x90\x80\x80",
                                                "\u212A",
                                                "k"};
  std::minstd_rand random(20240307);
  std::vector<std::string> texts(90);
  for (auto& text : texts)
    for (auto length = random() % 4; length > 0; --length) text += pieces[random() % std::size(pieces)];
  const auto sign = [](int order) { return (order > 0) - (order < 0); };
  for (const auto& a : texts)
    for (const auto& b : texts) {
      ASSERT_EQ(sign(compareText(a, b)), -sign(compareText(b, a)));
      if (compareText(a, b) > 0) continue;
      for (const auto& c : texts) ASSERT_FALSE(compareText(b, c) <= 0 && compareText(a, c) > 0);
    }
  EXPECT_NE(compareText("\x80", "\x81"), 0);
  EXPECT_NE(compareText("\xE9\x83", "\xE9\x84"), 0);
}

TEST(Utf8, LengthsAndPartsCountUtf16Units) {
  EXPECT_EQ(unitsOf("abc"), 3);
  EXPECT_EQ(unitsOf("部门😀"), 4);
  EXPECT_EQ(unitsOf("\xFF\xE9\x83"), 3);
  EXPECT_EQ(unitsAt("部门😀b", 1, 3), "门😀");
  EXPECT_EQ(unitsAt("😀b", 1, 2), "\uFFFDb");
  EXPECT_EQ(unitsAt("é", 0, INT64_MAX), "é");
  EXPECT_EQ(unitsAt("é", 5, INT64_MAX), "");
}

}  // namespace
}  // namespace QVSa::embedded
