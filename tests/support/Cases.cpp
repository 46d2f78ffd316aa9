#include "tests/support/Cases.h"

#include <algorithm>
#include <fstream>
#include <gtest/gtest.h>
#include <regex>
#include <sstream>

#include "QVSa/frame/ConnectionString.h"
#include "QVSa/frame/internal/Providers.h"
#include "QVSa/values/Text.h"

namespace QVSa::test {

namespace {

struct Case {
  std::string file;
  int line = 0;
  std::string kind;  // statement ok, statement error N..., query
  std::string batch;
  std::vector<std::string> rows;
};

std::vector<std::string> linesOf(const std::filesystem::path& path) {
  std::ifstream file(path);
  std::vector<std::string> lines;
  for (std::string line; std::getline(file, line);) lines.push_back(line);
  return lines;
}

bool isOrdered(const std::string& batch) {
  std::string lower = batch;
  std::ranges::transform(lower, lower.begin(), [](unsigned char c) { return static_cast<char>(std::tolower(c)); });
  return lower.find("order by") != std::string::npos;
}

// A case that stands on one line.
Case shortCase(const std::string& line) {
  std::smatch parts;
  if (std::regex_match(line, parts, std::regex("([0-9 ]+): (.*)")))
    return {"", 0, "statement error " + parts.str(1), parts.str(2), {}};
  if (!std::regex_match(line, parts, std::regex("(.*) -> (.*)"))) return {"", 0, "statement ok", line, {}};
  Case found{"", 0, "query", parts.str(1), {}};
  if (parts.str(2) == "none") return found;
  const std::string rows = replaceAll(parts.str(2), ", ", "\t");
  for (const String& row : split(replaceAll(rows, "; ", "\n"), '\n')) found.rows.push_back(row);
  return found;
}

// One that opens with its kind, up to an empty line; `at` goes to its last line.
Case longCase(const std::vector<std::string>& lines, std::size_t& at) {
  Case found{"", 0, lines[at], "", {}};
  // A batch ends at the rows' line, at an empty line where there are none.
  for (++at; at < lines.size() && lines[at] != "----" && !lines[at].empty(); ++at)
    found.batch += (found.batch.empty() ? "" : "\n") + lines[at];
  if (at < lines.size() && lines[at] == "----")
    for (++at; at < lines.size() && !lines[at].empty(); ++at) found.rows.push_back(lines[at]);
  return found;
}

std::vector<Case> casesOf(const std::filesystem::path& path) {
  std::vector<Case> cases;
  const auto lines = linesOf(path);
  for (std::size_t i = 0; i < lines.size(); ++i) {
    if (lines[i].empty() || lines[i][0] == '#') continue;
    const auto line = static_cast<int>(i + 1);
    const bool isLong = lines[i].starts_with("statement ") || lines[i] == "query";
    cases.push_back(isLong ? longCase(lines, i) : shortCase(lines[i]));
    cases.back().file = path.filename().string();
    cases.back().line = line;
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
    if (!isOrdered(expected.batch)) {
      std::ranges::sort(rows);
      std::ranges::sort(wanted);
    }
    EXPECT_EQ(rows, wanted);
  } catch (const Failure& failure) {
    ADD_FAILURE() << failure.native() << ": " << failure.description();
  }
}

}  // namespace

void runCases(const std::filesystem::path& folder, TestInstallation::Content content) {
  std::vector<std::filesystem::path> files;
  for (const auto& entry : std::filesystem::directory_iterator(folder))
    if (entry.path().extension() == ".test") files.push_back(entry.path());
  std::ranges::sort(files);
  std::size_t count = 0;
  for (const auto& file : files) {
    const TestInstallation installation(content);
    const auto session = openSession(parseConnectionString(buildConnString(installation.server(), "QVSys", false)));
    for (const auto& expected : casesOf(file)) {
      runCase(*session, expected);
      ++count;
    }
  }
  EXPECT_GT(count, 0U) << "no case in the folder";
}

}  // namespace QVSa::test
