// What statements of the dialect do not show of the functions beneath them; all else stands in
// tests/tsql/functions.test.

#include <chrono>
#include <gtest/gtest.h>

#include "providers/embedded/functions/Functions.h"
#include "tests/embedded/ScratchHandle.h"

namespace QVSa::embedded {
namespace {

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

TEST_F(Functions, TheSessionGivesTheMomentAndTheLastIdentity) {
  EXPECT_EQ(ask("t_scope_identity()"), "NULL");
  scratch_.context() = {.statementTicks = 300, .scopeIdentity = 7, .hasScopeIdentity = true};
  const Type identity{Base::decimal, 38};
  EXPECT_EQ(ask("t_getdate(), t_convert(t_scope_identity()," + std::to_string(codeOf(identity)) + "," +
                std::to_string(codeOf({Base::integer, -1})) + ",0,0)"),
            "300|7");
}

TEST_F(Functions, AFailureLeavesTheStatementUsable) {
  scratch_.run("create table t(x text); insert into t values('1'),('x'),('3')");
  const std::string toInt =
      std::to_string(codeOf({Base::nvarchar, -1})) + "," + std::to_string(codeOf({Base::integer, -1})) + ",0,0";
  Prepared query(scratch_.get(), "select t_convert(x," + toInt + ") from t where rowid=?");
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
