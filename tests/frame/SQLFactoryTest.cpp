#include <gtest/gtest.h>

#include "QVSa/frame/SQLFactory.h"

namespace QVSa {

namespace {

// The literal that the factory makes of one value.
String literal(Long type, const Variant& value, bool keepNull = false, bool escapeText = true) {
  SQLFactory factory;
  factory.AddPara("x", type, value, keepNull, escapeText);
  String sql = "<x>";
  EXPECT_TRUE(factory.makeSql(sql, "")) << factory.errDescription();
  return sql;
}

}  // namespace

TEST(SQLFactory, FillsEveryOccurrenceOfATokenAndLeavesUnknownOnes) {
  SQLFactory factory;
  factory.AddPara("a", paraNumber, 1, false, true);
  factory.AddPara("a", paraNumber, 2, false, true);
  factory.AddPara("b", paraText, "<c>", false, true);
  factory.AddPara("c", paraNumber, 3, false, true);
  String sql = "<a> <b> <A> <c> <a> <x> <y> <z>";
  EXPECT_TRUE(factory.makeSql(sql, "x,y"));
  EXPECT_EQ(sql, "1 N'3' <A> 3 1 null null <z>");
}

TEST(SQLFactory, TakesItsOwnTextWhereNoneIsGivenOrFailsUntilCleared) {
  SQLFactory factory;
  String sql;
  EXPECT_FALSE(factory.makeSql(sql, ""));
  EXPECT_EQ(factory.errNumber(), -1);
  EXPECT_EQ(factory.errDescription(), "have not sql of need replace.");
  factory.SQL("select <a>");
  factory.AddPara("a", paraNumber, 5, false, true);
  EXPECT_TRUE(factory.makeSql(sql, ""));
  EXPECT_EQ(sql, "select 5");
  factory.Clear();
  EXPECT_EQ(factory.errNumber(), 0);
  EXPECT_EQ(factory.errDescription(), "");
  sql.clear();
  EXPECT_TRUE(factory.makeSql(sql, ""));
  EXPECT_EQ(sql, "select <a>");
}

TEST(SQLFactory, AFailureKeepsWhatTheTextHadBecome) {
  SQLFactory factory;
  factory.AddPara("a", paraNumber, 1, false, true);
  factory.AddPara("b", paraVerbatim, Variant::null(), false, true);
  String sql = "<a> <b>";
  EXPECT_FALSE(factory.makeSql(sql, ""));
  EXPECT_EQ(factory.errNumber(), 94);
  EXPECT_EQ(sql, "1 <b>");
}

TEST(SQLFactory, NumbersGoAsTheirTextAndAnythingElseAsZero) {
  EXPECT_EQ(literal(paraNumber, 42), "42");
  EXPECT_EQ(literal(paraNumber, " 1e3 "), " 1e3 ");
  EXPECT_EQ(literal(paraNumber, true), "-1");
  EXPECT_EQ(literal(paraNumber, "abc"), "0");
  EXPECT_EQ(literal(paraNumber, "abc", true), "null");
  EXPECT_EQ(literal(paraNumber, "1;drop table users"), "0");
  EXPECT_EQ(literal(paraNumber, Variant()), "0");
  EXPECT_EQ(literal(paraNumber, Variant::null(), true), "null");
}

TEST(SQLFactory, TextsAreQuotedAndTrailingBlanksCut) {
  EXPECT_EQ(literal(paraText, "O'Brien"), "N'O''Brien'");
  EXPECT_EQ(literal(paraText, "O'Brien ", false, false), "N'O'Brien '");
  EXPECT_EQ(literal(paraText, " ab  "), "N' ab'");
  EXPECT_EQ(literal(paraText, "   "), "N''");
  EXPECT_EQ(literal(paraText, ""), "''");
  EXPECT_EQ(literal(paraText, "", true), "null");
  EXPECT_EQ(literal(paraText, Variant::null()), "''");
  EXPECT_EQ(literal(99, "部门"), "N'部门'");
  EXPECT_EQ(literal(paraText, 0), "N'0'");
}

TEST(SQLFactory, TheQuotesOfAModeAreDoubledAndNothingStaysNothing) {
  const String text = " a'b\"c ";
  EXPECT_EQ(sqlEscape(text, escapeSingle), Variant(" a''b\"c"));
  EXPECT_EQ(sqlEscape(text, escapeDouble), Variant(" a'b\"\"c"));
  EXPECT_EQ(sqlEscape(text, 0), Variant(" a''b\"\"c"));
  for (const Variant& nothing : {Variant(), Variant::null()}) EXPECT_EQ(sqlEscape(nothing, escapeSingle), nothing);
}

TEST(SQLFactory, DatesThatMeanNoneGoAsTheEmptyText) {
  for (const Date none : {Date(1900, 1, 1), Date(1900, 1, 2), Date(0.0)}) {
    EXPECT_EQ(literal(paraDate, none), "''");
    EXPECT_EQ(literal(paraDate, none, true), "null");
  }
  EXPECT_EQ(literal(paraDate, Date(1900, 1, 1, 8, 30)), "'19000101 08:30:00'");
  EXPECT_EQ(literal(paraDate, Date(1900, 1, 3)), "'19000103 00:00:00'");
  EXPECT_EQ(literal(paraDate, "2024-02-29 10:20:30"), "'20240229 10:20:30'");
  EXPECT_EQ(literal(paraDate, Date(1900, 1, 1), false, false), "'19000101 00:00:00'");
}

TEST(SQLFactory, NumbersReadAsDayNumbersWhereADateIsWanted) {
  EXPECT_EQ(literal(paraDate, 41000.5), "'20120401 12:00:00'");
  EXPECT_EQ(literal(paraDate, "41000.5"), "'20120401 12:00:00'");
  EXPECT_EQ(literal(paraDate, 0.5), "'19000101 12:00:00'");
  EXPECT_EQ(literal(paraDate, 3), "'19000102 00:00:00'");
  for (const double none : {0.0, 1.0, 2.0, -5.0}) EXPECT_EQ(literal(paraDate, none, true), "null") << none;
  EXPECT_EQ(literal(paraDate, "it's late", false, false), "'it's late'");
  EXPECT_EQ(literal(paraDate, "it's late"), "''");
  EXPECT_EQ(literal(paraDate, Variant::null()), "''");
}

TEST(SQLFactory, ListsAreCutAtTheirCommas) {
  EXPECT_EQ(literal(paraList, "a,b"), "N'a',N'b'");
  EXPECT_EQ(literal(paraList, "a'1, b "), "N'a''1',N' b'");
  EXPECT_EQ(literal(paraList, ""), "N''");
  EXPECT_EQ(literal(paraVerbatim, "a'b "), "a'b ");
  EXPECT_EQ(literal(paraVerbatim, Date(2024, 2, 29, 1, 2, 3)), "20240229 01:02:03");
}

TEST(DayNumberToDate, DropsPartsOfASecondAndNeverLosesAWholeOne) {
  EXPECT_EQ(dayNumberToDate(1.75), Date(1900, 1, 1, 18));
  EXPECT_EQ(dayNumberToDate(-0.25), Date(1900, 1, 1, 18));
  EXPECT_EQ(dayNumberToDate(45000 + 37230.9 / 86400).text(), "2023-03-15 10:20:30");
  for (int second = 0; second < 86400; ++second) {
    const Date moment(2023, 3, 15, second / 3600, second / 60 % 60, second % 60);
    ASSERT_EQ(dayNumberToDate(moment.days()).text(), moment.text());
  }
}

}  // namespace QVSa
