#include <chrono>
#include <gtest/gtest.h>

#include "providers/embedded/Functions.h"
#include "tests/embedded/ScratchHandle.h"

namespace QVSa::embedded {
namespace {

class Functions : public testing::Test {
 protected:
  std::string ask(const std::string& expressions) { return scratch_.ask(expressions); }

  // A date in the form yyyy-mm-dd hh:mm:ss.fff as ticks, and ticks in that form.
  static std::string ticks(const std::string& date) { return "t_convert('" + date + "',10,9,-1,0,0)"; }
  std::string dateOf(const std::string& expression) { return ask("t_convert(" + expression + ",9,10,-1,1,121)"); }

  ScratchHandle scratch_;
};

TEST_F(Functions, LikeKnowsItsWildcards) {
  EXPECT_EQ(
      ask("t_like('Sales','sal%'), t_like('Sales','_ales'), t_like('Sales','ales'), t_like('','%'), t_like('','_')"),
      "1|1|0|1|0");
  EXPECT_EQ(ask("t_like('50%','50[%]'), t_like('axb','a[_]b'), t_like('b','[a-f]'), t_like('B','[^a-f]'), "
                "t_like('-','[a-]'), "
                "t_like(']','[]')"),
            "1|0|1|0|1|0");
  EXPECT_EQ(ask("t_like('ab','[a'), t_like('a[b','a[[]b'), t_like('^','[a^]'), t_like('c','[^]')"), "0|1|1|1");
  EXPECT_EQ(ask("t_like('10%','10!%','!'), t_like('10x','10!%','!'), t_like('a]','a[!]]','!'), t_like('5!','5!!','!')"),
            "1|0|1|1");
  EXPECT_EQ(ask("t_like('x','x','ab')"), "fails 506");
  EXPECT_EQ(ask("t_like('部门一','部_一'), t_like('😀','_'), t_like('ÄRGER','är%'), t_like(NULL,'%'), t_like('a',NULL)"),
            "1|1|1|NULL|NULL");
  EXPECT_EQ(ask("t_like('.1.3.7.','%.3.%'), t_like('aXbXc','a%x%c'), t_like('aab','%ab'), t_like('ab ','ab')"),
            "1|1|1|0");
}

TEST_F(Functions, LikeDoesNotGetLostInManyWildcards) {
  const auto start = std::chrono::steady_clock::now();
  EXPECT_EQ(ask("t_like(t_replicate('a',5000), t_replicate('%a',30) || 'b')"), "0");
  EXPECT_LT(std::chrono::steady_clock::now() - start, std::chrono::seconds(2));
}

TEST_F(Functions, SearchingAndReplacingGoByTheFolding) {
  EXPECT_EQ(ask("t_charindex('.7.','.1.3.7.'), t_charindex('x','abc'), t_charindex('B','abc'), t_charindex('','abc')"),
            "5|0|2|0");
  EXPECT_EQ(
      ask("t_charindex('b','abcb',3), t_charindex('b','abcb',-4), t_charindex('b','abcb',9), t_charindex(NULL,'a')"),
      "4|2|0|NULL");
  EXPECT_EQ(ask("t_charindex('門','部😀門'), t_charindex('門','部😀門',4), t_charindex('K', '\u212A')"), "4|4|1");
  EXPECT_EQ(
      ask("t_replace('.1.3.7.','.1.3.','.1.5.'), t_replace('Sales-East','sales','West'), t_replace('abc','','x')"),
      ".1.5.7.|West-East|abc");
  EXPECT_EQ(ask("t_replace('aaa','aa','b'), t_replace('\u212Ak\u212A','k','-'), t_replace('ababac','abac','!')"),
            "ba|---|ab!");
  const auto start = std::chrono::steady_clock::now();
  scratch_.run("create table big(x); insert into big values(replace(hex(zeroblob(500000)),'00','a'))");
  EXPECT_EQ(ask("t_charindex(substr(x,1,250000)||'b', x) from big"), "0");
  EXPECT_LT(std::chrono::steady_clock::now() - start, std::chrono::seconds(5));
}

TEST_F(Functions, PartsOfTextsCountFromOne) {
  EXPECT_EQ(ask("t_substring('abcdef',2,3), t_substring('abcdef',0,3), t_substring('abcdef',-1,3), "
                "t_substring('abcdef',5,10), "
                "t_substring('abcdef',7,2), t_substring('abc',-9223372036854775807,9223372036854775807)"),
            "bcd|ab|a|ef||");
  EXPECT_EQ(ask("t_substring('abc',1,-1)"), "fails 537");
  EXPECT_EQ(ask("t_left('abc',-1)"), "fails 537");
  EXPECT_EQ(ask("t_right('abc',-1)"), "fails 536");
  EXPECT_EQ(ask("t_left('ab',5), t_right('abcdef',2), t_right('部门😀',2), t_len('ab  '), t_len('  ab'), t_len(120), "
                "t_len('😀')"),
            "ab|ef|😀|2|4|3|2");
  EXPECT_EQ(ask("t_ltrim('  a ')||'|'||t_rtrim(' a  ')||'|'||t_ltrim('  ')"), "a | a|");
  EXPECT_EQ(ask("t_upper('aBc ß é ж'), t_lower('ÀBC İ')"), "ABC ß É Ж|àbc İ");
  EXPECT_EQ(
      ask("t_replicate('ab',2), t_replicate('0',0), t_replicate('0',-1), length(t_replicate('abc',1000000000000))"),
      "abab||NULL|8000");
}

TEST_F(Functions, StrRightAlignsAndRoundsAwayFromZero) {
  EXPECT_EQ(ask("t_str(12), t_str(-3), t_str(2.5), t_str(-2.5)"), "        12|        -3|         3|        -3");
  EXPECT_EQ(ask("t_str(123.456,8,2), t_str(123.456,5,3), t_str(12345,3), t_str(-0.2,3), t_str(NULL), t_str(1,-1)"),
            "  123.46|123.5|***|  0|NULL|NULL");
}

TEST_F(Functions, ArithmeticOverflowsAsAnInt) {
  EXPECT_EQ(ask("t_add(2147483646,1), t_subtract(5,7), t_multiply(-3,4), t_negate(5), t_add(1.5,1), t_add(NULL,1)"),
            "2147483647|-2|-12|-5|2.5|NULL");
  for (const char* tooLarge : {"t_add(2147483647,1)", "t_subtract(-2147483648,1)", "t_multiply(65536,65536)",
                               "t_negate(-2147483648)", "t_multiply(9223372036854775807,2)"})
    EXPECT_EQ(ask(tooLarge), "fails 8115") << tooLarge;
  EXPECT_EQ(ask("t_divide(7,2), t_divide(-7,2), t_modulo(7,3), t_modulo(-7,3), t_divide(7.0,2), t_modulo(5,-1)"),
            "3|-3|1|-1|3.5|0");
  EXPECT_EQ(ask("t_divide(1,0)"), "fails 8134");
  EXPECT_EQ(ask("t_modulo(1.5,0)"), "fails 8134");
  EXPECT_EQ(
      ask("t_round(2.5,0), t_round(-2.345,2), t_round(155,-1), t_abs(-4), t_floor(-1.5), t_ceiling(1.2), t_floor(3)"),
      "3|-2.35|160|4|-2|2|3");
}

TEST_F(Functions, DatesMoveByPartsAndClampTheDay) {
  EXPECT_EQ(dateOf("t_dateadd('month',1," + ticks("20240131") + ")"), "2024-02-29 00:00:00.000");
  EXPECT_EQ(dateOf("t_dateadd('year',-1," + ticks("20240229 10:00:00.997") + ")"), "2023-02-28 10:00:00.997");
  EXPECT_EQ(dateOf("t_dateadd('quarter',-1," + ticks("20240115") + ")"), "2023-10-15 00:00:00.000");
  EXPECT_EQ(dateOf("t_dateadd('week',2," + ticks("20240225") + ")"), "2024-03-10 00:00:00.000");
  EXPECT_EQ(dateOf("t_dateadd('hour',-25," + ticks("20240301") + ")"), "2024-02-28 23:00:00.000");
  EXPECT_EQ(dateOf("t_dateadd('millisecond',2," + ticks("20240301") + ")"), "2024-03-01 00:00:00.003");
  EXPECT_EQ(dateOf("t_dateadd('millisecond',-5," + ticks("20240301") + ")"), "2024-02-29 23:59:59.997");
  EXPECT_EQ(ask("t_dateadd('day',1," + ticks("99991231") + ")"), "fails 517");
  EXPECT_EQ(ask("t_dateadd('month',-120000," + ticks("20240131") + ")"), "fails 517");
  EXPECT_EQ(ask("t_dateadd('day',3000000000,0)"), "fails 8115");
  EXPECT_EQ(ask("t_dateadd('fortnight',1,0)"), "fails 155");
}

TEST_F(Functions, DifferencesCountTheBoundariesBetween) {
  const auto diff = [&](const std::string& part, const std::string& from, const std::string& to) {
    return ask("t_datediff('" + part + "'," + ticks(from) + "," + ticks(to) + ")");
  };
  EXPECT_EQ(diff("year", "20231231 23:59:59", "20240101"), "1");
  EXPECT_EQ(diff("month", "20240131", "20240201"), "1");
  EXPECT_EQ(diff("quarter", "20240401", "20240331"), "-1");
  EXPECT_EQ(diff("day", "20240301 23:59", "20240307 00:01"), "6");
  EXPECT_EQ(diff("week", "20240302", "20240303"), "1");  // a Saturday and a Sunday
  EXPECT_EQ(diff("week", "18991230", "18991231"), "1");
  EXPECT_EQ(diff("minute", "20240301 10:00:59.997", "20240301 10:01"), "1");
  EXPECT_EQ(diff("second", "18000101", "17991231 23:59:59.5"), "-1");
  EXPECT_EQ(diff("millisecond", "20240301", "20240301 00:00:01.003"), "1003");
  EXPECT_EQ(diff("second", "17530101", "99991231"), "fails 535");
}

TEST_F(Functions, PartsOfADate) {
  const auto part = [&](const std::string& name, const std::string& date) {
    return ask("t_datepart('" + name + "'," + ticks(date) + ")");
  };
  EXPECT_EQ(part("year", "17530101") + part("month", "20240307") + part("day", "20240307"), "175337");
  EXPECT_EQ(part("quarter", "20240401") + part("dayofyear", "20241231"), "2366");
  EXPECT_EQ(part("weekday", "20240303") + part("weekday", "20240309") + part("weekday", "18000101"), "174");
  EXPECT_EQ(part("week", "20240101") + part("week", "20240107") + part("week", "20241231"), "1253");
  EXPECT_EQ(part("hour", "20240307 10:20:30.677") + part("minute", "20240307 10:20:30.677") +
                part("second", "20240307 10:20:30.677") + part("millisecond", "20240307 10:20:30.677"),
            "102030677");
}

TEST_F(Functions, TheSessionGivesTheMomentAndTheLastIdentity) {
  EXPECT_EQ(ask("t_scope_identity()"), "NULL");
  scratch_.context() = {.statementTicks = 300, .scopeIdentity = 7, .hasScopeIdentity = true};
  EXPECT_EQ(ask("t_getdate(), t_scope_identity()"), "300|7");
}

TEST_F(Functions, AFailureLeavesTheStatementUsable) {
  scratch_.run("create table t(x text); insert into t values('1'),('x'),('3')");
  Prepared query(scratch_.get(), "select t_convert(x,11,4,-1,0,0) from t where rowid=?");
  for (const auto& [row, expected] : {std::pair(1, "1"), std::pair(3, "3")}) {
    query.bind(1, std::int64_t{2});
    EXPECT_THROW(query.step(), Failure);
    query.bind(1, std::int64_t{row});
    ASSERT_TRUE(query.step());
    EXPECT_EQ(shown(query.column(0)), expected);
    query.reset();
  }
}

}  // namespace
}  // namespace QVSa::embedded
