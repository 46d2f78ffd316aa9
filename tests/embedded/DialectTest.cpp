// Every function and operator of the table, with every number of operands and every type.

#include <gtest/gtest.h>

#include "QVSa/frame/ConnectionString.h"
#include "providers/embedded/session/Provider.h"
#include "providers/tsql/Dialect.h"
#include "tests/support/Failures.h"
#include "tests/support/TestInstallation.h"

namespace QVSa::test {

namespace {

using tsql::Form;
using tsql::Operation;
using tsql::Takes;

std::unique_ptr<ProviderSession> open(const TestInstallation& installation) {
  return embedded::provider().open(parseConnectionString(buildConnString(installation.server(), "QVSys", false)));
}

// A column of each type in a table of one row, and what can be written out.
constexpr const char* operands[] = {"null", "b",  "ti", "si",  "i", "bi",  "d",   "r",   "sd",   "dt",  "vc",
                                    "nv",   "nt", "im", "'5'", "5", "1.5", "'x'", "1e0", "N'7'", "0x41"};

std::string joined(const std::vector<std::string>& parts, const std::string& between) {
  std::string text;
  for (const std::string& part : parts) text += (text.empty() ? "" : between) + part;
  return text;
}

// The call as a select over the table; operands[i] stand where values do.
std::string callOf(const Operation& row, std::vector<std::string> values) {
  const std::string name(row.name);
  for (std::size_t i = 0; i < values.size(); ++i) {
    const Takes takes = row.operand(i);
    if (takes == Takes::datePart) values[i] = "day";
    if (takes == Takes::type) values[i] = "nvarchar(9)";
    if (takes == Takes::style) values[i] = "120";
    if (takes == Takes::condition) values[i] += " is not null";
    if (takes == Takes::list && i > 0) values[i] = "(select " + values[i] + ")";
  }
  const std::string where = "select 1 from v where ";
  switch (row.form) {
    case Form::function:
    case Form::aggregate:
      return "select " + name + "(" + joined(values, ",") + ") from v";
    case Form::conversion:
      return "select " + name + "(" + joined(values, name == "cast" ? " as " : ",") + ") from v";
    case Form::sign:
      return "select " + name + joined(values, " ") + " from v";
    case Form::product:
    case Form::sum:
      return "select " + joined(values, name) + " from v";
    case Form::comparison:
    case Form::logical:
      return where + (name == "not" ? "not " + joined(values, " ") : joined(values, " " + name + " "));
    case Form::predicate:
      break;
  }
  if (name == "exists") return where + "exists (select " + joined(values, ",") + " from v)";
  if (name == "is null") return where + joined(values, " ") + " is null";
  if (name == "between") return where + values[0] + " between " + joined({values.begin() + 1, values.end()}, " and ");
  if (name == "like") return where + values[0] + " like " + joined({values.begin() + 1, values.end()}, " escape ");
  return where + values[0] + " in " + joined({values.begin() + 1, values.end()}, " ");
}

}  // namespace

TEST(Dialect, EveryRowAnswersOrRefusesByANumberOfSqlServer) {
  const TestInstallation installation(TestInstallation::Content::empty);
  const auto session = open(installation);
  session->run(
      {"create table v (b bit null, ti tinyint null, si smallint null, i int null, bi bigint null, d decimal(9,2) "
       "null, r float null, sd smalldatetime null, dt datetime null, vc varchar(9) null, nv nvarchar(9) null, nt "
       "ntext null, im image null)\n"
       "insert into v values (1,2,3,4,5,6.78,9.5,'20240307 10:20','20240307 10:20:30',' 8 ',N'ä','long',0x4142)"});
  std::size_t answered = 0;
  const auto expectAnswer = [&](const std::string& batch) {
    try {
      const auto result = session->run({batch});
      while (result.rows && result.rows->next()) ++answered;
    } catch (const Failure& failure) {
      EXPECT_NE(failure.native(), 0) << failure.description() << "\n" << batch;
    }
  };
  for (const Operation& row : tsql::dialect()) {
    const std::size_t before = answered;
    const std::size_t most = row.most == Operation::open ? row.least + 1 : row.most;
    for (std::size_t count = row.form == Form::predicate ? 1 : 0; count <= most + 1; ++count)
      for (const char* first : operands)
        for (const char* other : operands) {
          std::vector<std::string> values(count, other);
          if (count > 0) values[0] = first;
          expectAnswer(callOf(row, values));
          if (count < 2) break;
        }
    const bool isOldJoin = row.name == "*=" || row.name == "=*";
    EXPECT_TRUE(answered > before || isOldJoin) << row.name << " is never answered";
  }
}

}  // namespace QVSa::test
