#include <fstream>
#include <gtest/gtest.h>
#include <map>
#include <regex>

#include "QVSa/values/Text.h"
#include "platform/Services.h"
#include "tests/faults/Ground.h"
#include "tests/faults/Operations.h"
#include "tests/support/EnvironmentLocale.h"
#include "tests/support/FakeClock.h"
#include "tests/support/RecordingProvider.h"

namespace QVSa::test {
namespace {

// What differs from run to run stands in brackets: folders, encrypted texts, the computer's name.
String withoutChance(String text) {
  text = replaceAll(text, "'" + platform::services().computerName() + "'", "'[computer]'");
  text = std::regex_replace(text, std::regex("/[a-z/]*/qvsa-test-[A-Za-z0-9]{6}"), "[folder]");
  return std::regex_replace(text, std::regex("[A-Za-z0-9+/=\\r\\n]{60,}"), "[secret]");
}

// The events of an operation, on a copy of the filled installation.
String eventsOf(const Operation& operation, const std::filesystem::path& filled) {
  const Ground ground(filled);
  const Call call = operation.prepare(ground.server());
  const RecordingProvider recorder;
  EXPECT_TRUE(call().positive) << operation.name;
  String events;
  for (const String& event : recorder.log())
    if (event != "close") events += withoutChance(event) + "\n";
  return events;
}

std::map<String, String> readTable(const String& path) {
  std::map<String, String> table;
  std::ifstream file(path);
  String* events = nullptr;
  for (String line; std::getline(file, line);) {
    if (line.starts_with("= ")) {
      events = &table[line.substr(2)];
    } else if (events != nullptr) {
      *events += line + "\n";
    }
  }
  return table;
}

// Every operation opens, sends and commits what the table says, in that order. After a change on purpose the
// new table is statements.actual, in this test's working directory.
TEST(Statements, OfEveryOperationAreThoseOfTheTable) {
  const EnvironmentLocale english("C");
  const FakeClock clock(Date(2024, 3, 7, 10, 0, 0));
  const TestInstallation installation;
  fillGround(installation);

  const auto table = readTable(QVSA_SOURCE_DIR "/tests/statements/statements.txt");
  std::ofstream actual("statements.actual");
  for (const Operation& operation : operations()) {
    const String events = eventsOf(operation, installation.folder());
    actual << "= " << operation.name << "\n" << events;
    const auto expected = table.find(operation.name);
    EXPECT_EQ(events, expected == table.end() ? "" : expected->second) << operation.name;
  }
  EXPECT_EQ(table.size(), operations().size());
}

}  // namespace
}  // namespace QVSa::test
