// How long and how deep a statement may be: what is too much has a number of SQL Server, and nothing costs more than
// its length.

#include <ctime>
#include <gtest/gtest.h>

#include "QVSa/frame/ConnectionString.h"
#include "providers/embedded/session/Provider.h"
#include "providers/tsql/Parser.h"
#include "tests/support/Failures.h"
#include "tests/support/TestInstallation.h"

namespace QVSa::test {

namespace {

using std::chrono::seconds;

std::string repeated(const std::string& text, std::size_t times) {
  std::string whole;
  for (std::size_t i = 0; i < times; ++i) whole += text;
  return whole;
}

// `one` as often, each time with "#" as its number.
std::string numbered(const std::string& one, const std::string& between, std::size_t times) {
  std::string whole;
  for (std::size_t i = 0; i < times; ++i) {
    std::string next = one;
    for (std::size_t at = 0; (at = next.find('#')) != std::string::npos;) next.replace(at, 1, std::to_string(i));
    whole += (i == 0 ? "" : between) + next;
  }
  return whole;
}

class Limits : public testing::Test {
 protected:
  Limits() {
    session_->run({"create table t (id int primary key, a int null, x nvarchar(40) null)"});
    session_->run({"insert into t values (1,1,'a'),(2,2,'b')"});
  }

  // The first value of a batch, or the number of its failure: SQL Server's, or "timeout".
  std::string answer(const std::string& batch, int limit = 30) {
    try {
      const auto result = session_->run({batch, false, seconds(limit)});
      if (!result.rows || !result.rows->next()) return "none";
      const Variant value = result.rows->value(0);
      return value.isNull() ? "NULL" : value.toText();
    } catch (const Failure& failure) {
      if (failure.number() == number::timeout) return "timeout";
      return "fails " + std::to_string(failure.native());
    }
  }

  TestInstallation installation_{TestInstallation::Content::empty};
  std::unique_ptr<ProviderSession> session_ =
      embedded::provider().open(parseConnectionString(buildConnString(installation_.server(), "QVSys", false)));
};

constexpr std::size_t many = 5000;

}  // namespace

TEST_F(Limits, ChainsAreTakenWhateverTheirLength) {
  const std::string count = std::to_string(many);
  EXPECT_EQ(answer("select count(*) from t where " + numbered("id=#", " or ", many)), "2");
  EXPECT_EQ(answer("select count(*) from t where " + numbered("(id=# or x like '%#%')", " or ", many / 2)), "2");
  EXPECT_EQ(answer("select count(*) from t where " + numbered("id<>#+5", " and ", many)), "2");
  EXPECT_EQ(answer("select count(*) from t where not (" + numbered("a=#", " or ", many) + ")"), "0");
  EXPECT_EQ(answer("select len(" + numbered("'x'", "+", many) + ")"), count);
  EXPECT_EQ(answer("select max(" + numbered("a", "+", many) + ") from t"), std::to_string(2 * many));
  EXPECT_EQ(answer("select " + numbered("1", "-", many)), std::to_string(2 - static_cast<long>(many)));
  EXPECT_EQ(answer("select " + numbered("0.5", "+", many)), std::to_string(many / 2));
  EXPECT_EQ(answer("select " + numbered("1e0", "+", many)), count);
  EXPECT_EQ(answer("select " + numbered("null", "+", many) + "+1"), "NULL");
  EXPECT_EQ(answer("select case " + numbered("when id=#+9 then #", " ", many) + " else 7 end from t"), "7");
  EXPECT_EQ(answer("select " + numbered("case when id=#+9 then # else ", "", many) + "7" + repeated(" end", many) +
                   " from t"),
            "7");
  EXPECT_EQ(answer("select coalesce(" + repeated("null,", many) + "5)"), "5");
  EXPECT_EQ(answer("select count(*) from t where id in (" + numbered("a+#", ",", many) + ")"), "2");
  EXPECT_EQ(answer("select count(*) from (" + numbered("select # as n", " union all ", 400) + ") as u"), "400");
  EXPECT_EQ(answer("select " + numbered("1", "+", 3 * many)), "fails 191");
}

TEST_F(Limits, WhatIsNestedTooDeeplyIsRefusedByItsNumber) {
  struct Nest {
    const char* open;
    const char* inner;
    const char* close;
    int least;
    const char* before = "select ";
    const char* behind = "";
  };
  static constexpr Nest nests[] = {
      {"(select ", "1", ")", 14},
      {"(select max(a)+", "1", " from t where id<3)", 7},
      {"(select top 1 ", "1", " from t order by id)", 7},
      {"(", "1", ")", 100},
      {"upper(", "'a'", ")", 25},
      {"replace('a','a',", "'b'", ")", 15},
      {"convert(varchar,", "1", ")", 25},
      {"isnull(a,", "1", ")", 15, "select ", " from t"},
      {"case when a=1 then 0 when a=2 then ", "1", " else 3 end", 10, "select ", " from t"},
      {"case when a=", "1", " then 1 end", 10, "select ", " from t"},
      {"1+(1-", "1", ")", 14},
      {"- ", "1", "", 14},
      {"1.5*(2.5/", "1", ")", 14},
      {"not (", "1=1", ")", 28, "select 1 where "},
      {"1=1 and (1=0 or ", "1=1", ")", 12, "select 1 where "},
      {"exists (select 1 from t where ", "1=1", ")", 10, "select 1 where "},
      {"1 in (select 1 where ", "1=1", ")", 8, "select 1 where "},
      {"a between 1 and (select 1 where ", "1=1", ")", 7, "select 1 from t where "},
      {"(select * from ", "t", ") as d", 13, "select * from "},
      {"(select * from t union all select * from ", "t", ") as d", 10, "select * from "},
      {"(select x.id from t x join ", "t", " y on x.id=y.id) ", 8, "select 1 from t left join ", " z on t.id=z.id"},
  };
  constexpr std::size_t endless = 20000;
  for (const Nest& nest : nests) {
    const auto answerAt = [&](std::size_t times) {
      return answer(nest.before + repeated(nest.open, times) + nest.inner + repeated(nest.close, times) + nest.behind);
    };
    int taken = 0;
    for (int depth = 1; depth <= 120; depth += taken == depth ? 1 : 9) {
      const std::string answered = answerAt(static_cast<std::size_t>(depth));
      if (answered.starts_with("fails"))
        EXPECT_EQ(answered, "fails 191") << depth << ": " << nest.open;
      else
        taken = depth;
    }
    EXPECT_GE(taken, nest.least) << nest.open;
    EXPECT_EQ(answerAt(endless), "fails 191") << nest.open;
  }
}

TEST_F(Limits, WhatIsTooManyIsRefusedByItsNumber) {
  EXPECT_EQ(answer("select " + numbered("#", ",", 2001)), "fails 1056");
  EXPECT_EQ(answer("select * from t " + numbered("a#", ",t ", 65)), "fails 106");
  EXPECT_EQ(answer("select 1 from t a " + numbered("join t b# on a.id=b#.id", " ", 64)), "fails 106");
  EXPECT_EQ(answer("select count(*) from (select a.id from t a" + numbered(",t a#", "", 39) +
                   ") as p,(select a.id from t a" + numbered(",t a#", "", 39) + ") as q"),
            "fails 106");
  EXPECT_EQ(answer(numbered("select #", " union all ", 501)), "fails 191");
  EXPECT_EQ(answer("insert into t(id) values " + numbered("(#)", ",", 1001)), "fails 10738");
  EXPECT_EQ(answer("create table w (" + numbered("c# int", ",", 1025) + ")"), "fails 1702");
  EXPECT_EQ(answer("select 1 from t group by " + numbered("a+#", ",", 2001)), "fails 8623");
  EXPECT_EQ(answer("select a from t order by " + numbered("a+#", ",", 2001)), "fails 8623");
  EXPECT_EQ(answer("select case " + numbered("when a=# then #", " ", 20000) + " end from t"), "fails 8623");
}

// 400,000 literals took 26 s once, 20,000 branches 14 s.
TEST_F(Limits, LiteralsCostTheirLengthAndTheTimeLimitHolds) {
  const std::clock_t start = std::clock();
  EXPECT_EQ(answer("select count(*) from t where id in (" + numbered("#", ",", 400000) + ")"), "2");
  EXPECT_EQ(answer(repeated("select 1 where 'a'='b'\n", 20000)), "none");
  EXPECT_EQ(answer("select case a " + numbered("when # then 'x'", " ", 9000) + " end from t"), "x");
  EXPECT_LT((std::clock() - start) / CLOCKS_PER_SEC, 15);
}

TEST_F(Limits, TheTimeLimitHoldsBeforeAStatementRuns) {
  const tsql::Deadline passed(std::chrono::steady_clock::now());
  const std::string batch = numbered("select # where 1=1", "\n", 500);
  EXPECT_EQ(failureOf([&] { tsql::tokenize(batch, passed); }), number::timeout);
  EXPECT_EQ(failureOf([&] { tsql::parse(tsql::tokenize(batch), passed); }), number::timeout);
  // Each view doubles the one before it: a short statement with a very large tree.
  session_->run({"create view v0 as select id from t"});
  std::string answered = "none";
  for (int i = 0; i < 25 && answered == "none"; ++i) {
    const std::string before = "select id from v" + std::to_string(i);
    answered = answer("create view v" + std::to_string(i + 1) + " as " + before + " union all " + before, 300);
  }
  EXPECT_EQ(answered, "fails 8623");
}

}  // namespace QVSa::test
