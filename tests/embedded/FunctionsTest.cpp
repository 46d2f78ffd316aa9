#include <algorithm>
#include <chrono>
#include <gtest/gtest.h>
#include <random>
#include <vector>

#include "QVSa/values/Failure.h"
#include "providers/embedded/functions/Collation.h"
#include "providers/embedded/functions/Conversions.h"
#include "providers/embedded/functions/Functions.h"
#include "providers/embedded/functions/ListTable.h"
#include "providers/embedded/functions/Utf8.h"
#include "tests/embedded/ScratchHandle.h"

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

constexpr Type text{Base::nvarchar, -1};
constexpr Type ascii{Base::varchar, -1};
constexpr Type whole{Base::integer, -1};
constexpr Type small{Base::smallint, -1};
constexpr Type moment{Base::datetime, -1};

struct Case {
  Value value;
  Type from;
  Type to;
  std::string expected;  // "N" and SQL Server's number for a failure
  Purpose purpose = Purpose::cast;
  int style = 0;
};

std::string converted(const Case& c) {
  try {
    return shown(convert(c.value, c.from, c.to, c.purpose, c.style));
  } catch (const Failure& failure) {
    return "N" + std::to_string(failure.native());
  }
}

void expectAll(const std::vector<Case>& cases) {
  for (const Case& c : cases)
    EXPECT_EQ(converted(c), c.expected) << shown(c.value) << " as " << nameOf(c.from.base) << " to "
                                        << nameOf(c.to.base) << "(" << c.to.size << ") style " << c.style;
}

Value n(std::int64_t value) { return value; }

// Reads a date and shows it to the millisecond.
std::string asDate(const std::string& value, Base base = Base::datetime, int style = 0) {
  const std::string ticks = converted({value, ascii, {base, -1}, "", Purpose::cast, style});
  return ticks[0] == 'N' ? ticks : converted({n(std::stoll(ticks)), moment, text, "", Purpose::cast, 121});
}

TEST(Conversions, TextBecomesAWholeNumberOrSaysWhyNot) {
  expectAll({{" 3 ", ascii, small, "3"},
             {"", text, whole, "0"},
             {"  ", text, whole, "0"},
             {"+12", text, whole, "12"},
             {"-0012", text, whole, "-12"},
             {"abc", text, whole, "N245"},
             {"1.5", text, whole, "N245"},
             {"1 2", text, whole, "N245"},
             {"+-1", text, whole, "N245"},
             {"40000", text, small, "N244"},
             {"300", text, {Base::tinyint, -1}, "N244"},
             {"-1", text, {Base::tinyint, -1}, "N244"},
             {"2147483647", text, whole, "2147483647"},
             {"2147483648", text, whole, "N248"},
             {"99999999999999999999", text, whole, "N248"},
             {"99999999999999999999", text, {Base::bigint, -1}, "N8115"},
             {"True", text, {Base::bit, -1}, "1"},
             {"false", text, {Base::bit, -1}, "0"},
             {"-7", text, {Base::bit, -1}, "1"}});
  try {
    convert(std::string("abc"), text, whole, Purpose::compute);
    FAIL();
  } catch (const Failure& failure) {
    EXPECT_EQ(failure.description(), "Conversion failed when converting the nvarchar value 'abc' to data type int.");
  }
}

TEST(Conversions, NumbersKeepToTheRangeOfTheirType) {
  expectAll({{n(-1), whole, {Base::bit, -1}, "1"},
             {n(0), whole, {Base::bit, -1}, "0"},
             {0.5, {Base::real, -1}, {Base::bit, -1}, "1"},
             {n(40000), whole, small, "N220"},
             {n(256), whole, {Base::tinyint, -1}, "N220"},
             {n(3000000000), {Base::bigint, -1}, whole, "N8115"},
             {-2.9, {Base::real, -1}, whole, "-2"},
             {2147483648.0, {Base::real, -1}, whole, "N8115"},
             {1e300, {Base::real, -1}, {Base::bigint, -1}, "N8115"},
             {" 1.5e2 ", text, {Base::real, -1}, "150"},
             {"", text, {Base::real, -1}, "0"},
             {"1,5", text, {Base::real, -1}, "N8114"},
             {"nan", text, {Base::real, -1}, "N8114"},
             {"1e999", text, {Base::real, -1}, "N8114"},
             {Value(), text, whole, "NULL"}});
}

TEST(Conversions, NumbersAreWrittenAsTheDialectWritesThem) {
  const Type real{Base::real, -1};
  const Type decimal{Base::decimal, 18, 1};
  const Value exact = convert(2.5, real, decimal, Purpose::cast);
  expectAll({{n(12345), whole, {Base::varchar, 3}, "*"},
             {n(12345), whole, {Base::nvarchar, 3}, "N8115"},
             {n(12345), whole, {Base::varchar, 3}, "N8115", Purpose::store},
             {n(12345678901), {Base::bigint, -1}, {Base::varchar, 3}, "N8115"},
             {n(-5), whole, {Base::varchar, 2}, "-5"},
             {exact, decimal, ascii, "2.5"},
             {exact, decimal, whole, "2"},
             {0.1, real, ascii, "0.1"},
             {3.14159265, real, ascii, "3.14159"},
             {1234567.0, real, ascii, "1.23457e+006"},
             {1e-5, real, ascii, "1e-005"},
             {1e100, real, ascii, "1e+100"},
             {1.5, real, ascii, "1.5000000e+000", Purpose::cast, 1}});
}

TEST(Conversions, ATextThatIsTooLongIsCutByCastAndRefusedByAColumn) {
  expectAll({{"abcdef", text, {Base::nvarchar, 4}, "abcd"},
             {"abcdef", text, {Base::nvarchar, 4}, "N8152", Purpose::store},
             {"abcd   ", text, {Base::nvarchar, 4}, "abcd", Purpose::store},
             {"abcdef", text, {Base::nvarchar, 4}, "abcdef", Purpose::compute},
             {"部门名称", text, {Base::nvarchar, 4}, "部门名称", Purpose::store},
             {"a😀b", text, {Base::nvarchar, 4}, "a😀b", Purpose::store},
             {"a😀b", text, {Base::nvarchar, 2}, "a\xEF\xBF\xBD"},
             {Bytes{1, 2, 3}, {Base::image, -1}, {Base::image, 2}, "N8152", Purpose::store},
             {Bytes{1}, {Base::image, -1}, whole, "N529"}});
}

TEST(Conversions, DatesAreReadInEveryUsualForm) {
  EXPECT_EQ(asDate("20240307"), "2024-03-07 00:00:00.000");
  EXPECT_EQ(asDate("20240307 10:20"), "2024-03-07 10:20:00.000");
  EXPECT_EQ(asDate(" 2024-3-7 10:20:30.5 "), "2024-03-07 10:20:30.500");
  EXPECT_EQ(asDate("2024-03-07T10:20:30"), "2024-03-07 10:20:30.000");
  EXPECT_EQ(asDate("3/7/2024 10:20:30.998 PM"), "2024-03-07 22:20:30.997");
  EXPECT_EQ(asDate("7/3/2024", Base::datetime, 103), "2024-03-07 00:00:00.000");
  EXPECT_EQ(asDate("Mar  7 2024 12:05AM"), "2024-03-07 00:05:00.000");
  EXPECT_EQ(asDate("7 March 2024"), "2024-03-07 00:00:00.000");
  EXPECT_EQ(asDate("490307"), "2049-03-07 00:00:00.000");
  EXPECT_EQ(asDate("10:20"), "1900-01-01 10:20:00.000");
  EXPECT_EQ(asDate(""), "1900-01-01 00:00:00.000");
  EXPECT_EQ(asDate("17530101"), "1753-01-01 00:00:00.000");
  for (const char* malformed : {"not a date", "2024-03", "2024030", "20240307x", "20240307 10",
                                "20240307 10:20:30.1234", "Foo 7 2024", "7/3-2024", "10:20 XM", "20240307 10:20 30"})
    EXPECT_EQ(asDate(malformed), "N241") << malformed;
  for (const char* impossible : {"20241301", "20240230", "17521231", "20240307 24:00", "20240307 10:60", "13:00 PM"})
    EXPECT_EQ(asDate(impossible), "N242") << impossible;
}

TEST(Conversions, ASmalldatetimeRoundsToTheMinute) {
  EXPECT_EQ(asDate("20240307 10:20:29.998", Base::smalldatetime), "2024-03-07 10:20:00.000");
  EXPECT_EQ(asDate("20240307 10:20:29.999", Base::smalldatetime), "2024-03-07 10:21:00.000");
  EXPECT_EQ(asDate("20240307 23:59:45", Base::smalldatetime), "2024-03-08 00:00:00.000");
  EXPECT_EQ(asDate("20790606 23:59:30", Base::smalldatetime), "N296");
  EXPECT_EQ(asDate("18991231", Base::smalldatetime), "N296");
  EXPECT_EQ(asDate("soon", Base::smalldatetime), "N295");
}

TEST(Conversions, DatesAreWrittenInTheStyleAskedFor) {
  const Value afternoon = convert(std::string("2024-03-07 15:04:05.678"), ascii, moment, Purpose::cast);
  expectAll({{afternoon, moment, text, "Mar  7 2024  3:04PM"},
             {afternoon, moment, text, "20240307", Purpose::cast, 112},
             {afternoon, moment, text, "2024-03-07 15:04:05", Purpose::cast, 120},
             {afternoon, moment, text, "2024-03-07 15:04:05.677", Purpose::cast, 121},
             {afternoon, moment, text, "2024-03-07T15:04:05.677", Purpose::cast, 126},
             {afternoon, moment, text, "15:04:05", Purpose::cast, 108},
             {afternoon, moment, text, "07/03/2024", Purpose::cast, 103},
             {afternoon, moment, {Base::varchar, 10}, "2024-03-07", Purpose::cast, 120},
             {n(0), moment, text, "Jan  1 1900 12:00AM"},
             {afternoon, moment, text, "N281", Purpose::cast, 77}});
  // The default form of a date comes back as the date that it was, to the minute.
  EXPECT_EQ(asDate("Mar  7 2024  3:04PM"), "2024-03-07 15:04:00.000");
  expectAll({{n(1), whole, moment, "25920000"},
             {0.5, {Base::real, -1}, moment, "12960000"},
             {n(4000000), whole, moment, "N8115"},
             {n(12960000), moment, whole, "1"},
             {n(12959999), moment, whole, "0"}});
}

TEST(Conversions, ADateSurvivesTheWayThroughTheLibrarysOwn) {
  for (const char* date : {"17530101 06:00", "18991229 18:00", "18991231 23:59:59.997", "19000101",
                           "20240229 12:34:56.789", "99991231 23:59:59.997"}) {
    const std::int64_t ticks = std::get<std::int64_t>(convert(std::string(date), ascii, moment, Purpose::cast));
    EXPECT_EQ(ticksOf(dateOf(ticks)), ticks) << date;
  }
  const Date early =
      dateOf(std::get<std::int64_t>(convert(std::string("18991229 18:00"), ascii, moment, Purpose::cast)));
  EXPECT_EQ(early.text(), "1899-12-29 18:00:00");
}

TEST(Conversions, CallersSeeTheKindThatBelongsToTheColumn) {
  EXPECT_EQ(variantOf(n(1), {Base::bit, -1}), Variant(true));
  EXPECT_EQ(variantOf(n(7), small), Variant(Integer{7}));
  EXPECT_EQ(variantOf(n(7), whole), Variant(Long{7}));
  const Type decimal{Base::decimal, 10, 2};
  EXPECT_EQ(variantOf(convert(n(3), whole, decimal, Purpose::cast), decimal), Variant(Long{3}));
  EXPECT_EQ(variantOf(valueOf(Variant(2.5), decimal), decimal), Variant(2.5));
  EXPECT_EQ(variantOf(n(3000000000), {Base::bigint, -1}), Variant(3000000000.0));
  EXPECT_EQ(variantOf(3.0, {Base::real, -1}), Variant(3.0));
  EXPECT_TRUE(variantOf(Value(), whole).isNull());

  EXPECT_EQ(shown(valueOf(Variant(true), {Base::bit, -1})), "1");
  EXPECT_EQ(shown(valueOf(Variant(true), small)), "-1");
  EXPECT_EQ(shown(valueOf(Variant(2.75), whole)), "2");
  EXPECT_EQ(shown(valueOf(Variant(Long{12}), text)), "12");
  EXPECT_EQ(shown(valueOf(Variant(Date(2024, 3, 7)), moment)),
            shown(convert(std::string("20240307"), text, moment, Purpose::cast)));
  EXPECT_EQ(shown(valueOf(Variant(), whole)), "NULL");
  EXPECT_THROW(valueOf(Variant("12345"), {Base::nvarchar, 4}), Failure);
}

class Functions : public testing::Test {
 protected:
  std::string ask(const std::string& expressions) { return scratch_.ask(expressions); }

  ScratchHandle scratch_;
};

TEST_F(Functions, LikeDoesNotGetLostInManyWildcards) {
  const auto start = std::chrono::steady_clock::now();
  EXPECT_EQ(ask("t_like(t_replicate('a',5000,-1), t_replicate('%a',30,-1) || 'b')"), "0");
  EXPECT_LT(std::chrono::steady_clock::now() - start, std::chrono::seconds(2));
}

TEST_F(Functions, ASearchIsLinearInTheText) {
  EXPECT_EQ(ask("t_charindex('K', '\u212A'), t_replace('\u212Ak\u212A','k','-',-1)"), "1|---");
  const auto start = std::chrono::steady_clock::now();
  scratch_.run("create table big(x); insert into big values(replace(hex(zeroblob(500000)),'00','a'))");
  EXPECT_EQ(ask("t_charindex(substr(x,1,250000)||'b', x) from big"), "0");
  EXPECT_LT(std::chrono::steady_clock::now() - start, std::chrono::seconds(5));
}

class ListTable : public testing::Test {
 protected:
  ListTable() {
    scratch_.run("create table t(id integer primary key, name text collate tsql, n integer)");
    scratch_.run("create index byName on t(name)");
    scratch_.run("create index byN on t(n)");
    scratch_.run(
        "with recursive c(i) as (select 1 union all select i+1 from c where i<1000) "
        "insert into t select i, 'name' || i, i*10 from c");
  }

  std::string planOf(const std::string& select) {
    Prepared query(scratch_.get(), "explain query plan " + select);
    std::string plan;
    while (query.step()) plan += shown(query.column(3)) + "\n";
    return plan;
  }

  ScratchHandle scratch_;
};

TEST_F(ListTable, TheIndexOfTheOtherTableIsUsed) {
  EXPECT_NE(planOf("select id from t where n in (select value from list(?))").find("SEARCH t USING"),
            std::string::npos);
  EXPECT_NE(planOf("select id from t where name in (select value from list(?))").find("byName"), std::string::npos);
  EXPECT_NE(planOf("select id from t, list(?) l where t.n=l.value").find("SEARCH t USING"), std::string::npos);
  EXPECT_NE(planOf("select id from t where id in (select value from list(?))").find("PRIMARY KEY"), std::string::npos);
}

}  // namespace
}  // namespace QVSa::embedded
