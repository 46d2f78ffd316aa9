// Runs the data-driven cases: recorded ones of another T-SQL server, and the project's own.

#include <algorithm>
#include <filesystem>
#include <fstream>
#include <gtest/gtest.h>
#include <sstream>

#include "QVSa/frame/ConnectionString.h"
#include "providers/embedded/session/Provider.h"
#include "tests/support/TestInstallation.h"

namespace QVSa::test {

namespace {

struct Case {
  std::string file;
  int line = 0;
  std::string kind;  // statement ok, statement error N..., query
  std::string batch;
  std::vector<std::string> rows;
  bool ordered = false;
};

std::vector<std::string> linesOf(const std::filesystem::path& path) {
  std::ifstream file(path);
  std::vector<std::string> lines;
  for (std::string line; std::getline(file, line);) lines.push_back(line);
  return lines;
}

bool opensCase(const std::string& line) { return line.starts_with("statement ") || line == "query"; }

std::vector<Case> casesOf(const std::filesystem::path& path) {
  std::vector<Case> cases;
  const auto lines = linesOf(path);
  for (std::size_t i = 0; i < lines.size(); ++i) {
    if (!opensCase(lines[i])) continue;
    Case found{path.filename().string(), static_cast<int>(i + 1), lines[i], "", {}};
    // A batch ends at the rows' line, at an empty line where there are none.
    for (++i; i < lines.size() && lines[i] != "----" && !lines[i].empty(); ++i)
      found.batch += (found.batch.empty() ? "" : "\n") + lines[i];
    if (i < lines.size() && lines[i] == "----")
      for (++i; i < lines.size() && !lines[i].empty(); ++i) found.rows.push_back(lines[i]);
    std::string lower = found.batch;
    std::ranges::transform(lower, lower.begin(), [](unsigned char c) { return static_cast<char>(std::tolower(c)); });
    found.ordered = lower.find("order by") != std::string::npos;
    cases.push_back(std::move(found));
  }
  return cases;
}

std::string cell(const Variant& value) {
  if (value.isNull()) return "NULL";
  if (value.isBoolean()) return value.toBoolean() ? "1" : "0";
  const std::string text = value.toText();
  return text.empty() ? "(empty)" : text;
}

std::vector<std::string> rowsOf(Rows* rows) {
  std::vector<std::string> result;
  while (rows && rows->next()) {
    std::string line;
    for (std::size_t i = 0; i < rows->columns().size(); ++i) line += (i ? "\t" : "") + cell(rows->value(i));
    result.push_back(line);
  }
  return result;
}

void expectError(ProviderSession& session, const Case& expected) {
  try {
    session.run({expected.batch});
    ADD_FAILURE() << "no failure";
  } catch (const Failure& failure) {
    std::istringstream numbers(expected.kind.substr(std::string("statement error").size()));
    bool met = false;
    for (Long number = 0; numbers >> number;) met = met || number == failure.native();
    EXPECT_TRUE(met) << "got " << failure.native() << ": " << failure.description();
  }
}

void runCase(ProviderSession& session, const Case& expected) {
  SCOPED_TRACE(expected.file + ":" + std::to_string(expected.line) + ": " + expected.batch);
  if (expected.kind.starts_with("statement error")) return expectError(session, expected);
  try {
    auto result = session.run({expected.batch});
    if (expected.kind != "query") return;
    auto rows = rowsOf(result.rows.get());
    auto wanted = expected.rows;
    if (!expected.ordered) {
      std::ranges::sort(rows);
      std::ranges::sort(wanted);
    }
    EXPECT_EQ(rows, wanted);
  } catch (const Failure& failure) {
    ADD_FAILURE() << failure.native() << ": " << failure.description();
  }
}

void runFolder(const std::filesystem::path& folder) {
  std::vector<std::filesystem::path> files;
  for (const auto& entry : std::filesystem::directory_iterator(folder))
    if (entry.path().extension() == ".test") files.push_back(entry.path());
  std::ranges::sort(files);
  std::size_t count = 0;
  for (const auto& file : files) {
    const TestInstallation installation(TestInstallation::Content::empty);
    const auto session =
        embedded::provider().open(parseConnectionString(buildConnString(installation.server(), "QVSys", false)));
    for (const auto& expected : casesOf(file)) {
      runCase(*session, expected);
      ++count;
    }
  }
  EXPECT_GT(count, 0U) << "no case in the folder";
}

}  // namespace

TEST(TheEngine, AnswersAsTheRecordedServerDid) {
  const std::filesystem::path recorded = std::filesystem::path(QVSA_SOURCE_DIR) / ".." / "shared" / "tsql";
  if (!std::filesystem::is_directory(recorded))
    GTEST_SKIP() << "the recorded cases are not here; the project's own cases stand alone";
  runFolder(recorded);
}

TEST(TheEngine, AnswersTheProjectsOwnCases) { runFolder(std::filesystem::path(QVSA_SOURCE_DIR) / "tests" / "tsql"); }

}  // namespace QVSa::test
