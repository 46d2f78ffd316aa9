#include <algorithm>
#include <fstream>
#include <gtest/gtest.h>
#include <map>
#include <optional>
#include <regex>

#include "QVSa/values/Text.h"
#include "platform/Services.h"
#include "tests/faults/Ground.h"
#include "tests/faults/Operations.h"
#include "tests/support/EnvironmentLocale.h"
#include "tests/support/FakeClock.h"
#include "tests/support/PlainSession.h"
#include "tests/support/RecordingProvider.h"
#include "tests/support/TestInstallation.h"
#include "tests/support/TestServer.h"

namespace QVSa::test {
namespace {

// What differs from run to run stands in brackets: folders, encrypted texts, the computer's name.
String withoutChance(String text) {
  text = replaceAll(text, "'" + platform::services().computerName() + "'", "'[computer]'");
  text = std::regex_replace(text, std::regex("/[a-z/]*/qvsa-test-[A-Za-z0-9]{6}"), "[folder]");
  return std::regex_replace(text, std::regex("[A-Za-z0-9+/=\\r\\n]{60,}"), "[secret]");
}

String eventsOn(const String& server, const Operation& operation) {
  const Call call = operation.prepare(server);
  const RecordingProvider recorder;
  EXPECT_TRUE(call().positive) << operation.name;
  String events;
  for (const String& event : recorder.log())
    if (event != "close") events += withoutChance(event) + "\n";
  return events;
}

// What the operations work on: a copy of one filled installation for each. A server has one installation, which is
// made and filled anew.
class Grounds {
 public:
  Grounds() {
    if (onServer()) return;
    filled_.emplace();
    fillGround(*filled_);
  }

  String eventsOf(const Operation& operation) const {
    if (filled_) return eventsOn(Ground(filled_->folder()).server(), operation);
    const TestInstallation fresh;
    fillGround(fresh);
    return eventsOn(fresh.server(), operation);
  }

 private:
  std::optional<TestInstallation> filled_;
};

// Backups of a server lie on its own machine.
bool makesFiles(const String& events) {
  const String upper = upperCase(events);
  return upper.find("BACKUP DATABASE") != String::npos || upper.find("RESTORE ") != String::npos;
}

// A server has times of its own in its rows, and another order where none is asked for.
Lines asOnServer(const String& events) {
  Lines lines = split(std::regex_replace(events, std::regex("\\d{8} [\\d:]{8}"), "[time]"), '\n');
  std::ranges::sort(lines);
  return lines;
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
  const auto table = readTable(QVSA_SOURCE_DIR "/tests/statements/statements.txt");
  std::ofstream actual("statements.actual");
  const Grounds grounds;
  for (const Operation& operation : operations()) {
    const auto found = table.find(operation.name);
    const String expected = found == table.end() ? "" : found->second;
    if (onServer() && makesFiles(expected)) continue;
    const String events = grounds.eventsOf(operation);
    actual << "= " << operation.name << "\n" << events;
    if (onServer())
      EXPECT_EQ(asOnServer(events), asOnServer(expected)) << operation.name;
    else
      EXPECT_EQ(events, expected) << operation.name;
  }
  EXPECT_EQ(table.size(), operations().size());
}

}  // namespace
}  // namespace QVSa::test
