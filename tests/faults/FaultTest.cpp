#include <algorithm>
#include <array>
#include <gtest/gtest.h>

#include "tests/faults/Ground.h"
#include "tests/faults/Operations.h"
#include "tests/support/FakeClock.h"
#include "tests/support/RecordingProvider.h"

namespace QVSa::test {

void PrintTo(const Operation& operation, std::ostream* out) { *out << operation.name; }

namespace {

const Failure madeUp(number::of(0x80041234), "a test", "This failure is made up.");

const std::filesystem::path& filledFolder() {
  static const TestInstallation installation;
  static const bool done = [] {
    fillGround(installation);
    return true;
  }();
  static_cast<void>(done);
  return installation.folder();
}

bool beginsWith(const String& text, const String& beginning) { return text.rfind(beginning, 0) == 0; }

bool isStatement(const String& event) {
  return !beginsWith(event, "open ") && event != "set nocount on" && event != "begin" && event != "commit" &&
         event != "rollback" && event != "close";
}

bool isWrite(const String& event) {
  // A restore brings back what the tables hold.
  constexpr std::array harmless{
      "select ", "use ", "alter database ", "RESTORE DATABASE ", "sp_changedbowner ", "begin transaction "};
  return isStatement(event) &&
         std::ranges::none_of(harmless, [&](const char* beginning) { return beginsWith(event, beginning); });
}

Lines eventsOf(const RecordingProvider& recorder) {
  Lines events = recorder.log();
  std::erase_if(events, [](const String& event) { return event == "rollback" || event == "close"; });
  return events;
}

// The statement that an event belongs to: a commit to the one before it, an opening or a beginning to the next one.
String statementAt(const Lines& events, std::size_t place) {
  const auto at = events.begin() + static_cast<std::ptrdiff_t>(place);
  if (*at == "commit") return *std::find_if(std::make_reverse_iterator(at), events.rend(), isStatement);
  return *std::find_if(at, events.end(), isStatement);
}

const LetPass* passing(const Operation& operation, const String& event, const String& statement) {
  const auto found = std::ranges::find_if(letPass(), [&](const LetPass& point) {
    return String(point.operation) == operation.name && beginsWith(point.alone ? event : statement, point.statement);
  });
  return found == letPass().end() ? nullptr : &*found;
}

auto reportOf(const Operation& operation, const String& statement) {
  return std::ranges::find_if(operation.reports,
                              [&](const Report& candidate) { return beginsWith(statement, candidate.statement); });
}

bool goesOn(const Operation& operation, const String& statement) {
  const auto report = reportOf(operation, statement);
  return report != operation.reports.end() && report->goesOn;
}

void expectReported(const Operation& operation, const String& event, const String& statement, const Outcome& outcome) {
  if (const LetPass* const point = passing(operation, event, statement)) {
    EXPECT_TRUE(outcome.positive) << point->reason;
    EXPECT_EQ(outcome.errNumber == madeUp.number(), point->reported);
    return;
  }
  const auto report = reportOf(operation, statement);
  const bool told = report != operation.reports.end();
  const bool silent = told && report->silent;
  EXPECT_FALSE(outcome.positive);
  const Long number = told && report->number != 0 ? report->number : madeUp.number();
  EXPECT_EQ(outcome.errNumber, silent ? 0 : number);
  EXPECT_EQ(outcome.errDescription,
            silent ? "" : (told ? report->prefix : "") + madeUp.description() + (told ? report->suffix : ""));
}

class EveryOperation : public testing::TestWithParam<Operation> {
 protected:
  // The events of an undisturbed call.
  Lines undisturbed() {
    const Ground ground(filledFolder());
    const auto call = GetParam().prepare(ground.server());
    Lines events;
    {
      const RecordingProvider recorder;
      const Outcome outcome = call();
      EXPECT_TRUE(outcome.positive) << outcome.errDescription;
      EXPECT_EQ(recorder.openSessions(), 0);
      events = eventsOf(recorder);
    }
    counts_ = ground.counts();
    return events;
  }

  void failAt(const Lines& events, std::size_t place) {
    const Operation& operation = GetParam();
    const Ground ground(filledFolder());
    const auto call = operation.prepare(ground.server());
    const Lines before = ground.tables();
    {
      RecordingProvider recorder;
      recorder.failAt(static_cast<int>(place) + 1, madeUp);
      const Outcome outcome = call();
      ASSERT_TRUE(recorder.hasFailed());
      EXPECT_EQ(recorder.openSessions(), 0);
      expectReported(operation, events[place], statementAt(events, place), outcome);
    }
    const auto end = events.begin() + static_cast<std::ptrdiff_t>(place);
    const bool mayHaveWritten =
        operation.atomic ? std::find(events.begin(), end, "commit") != end : std::any_of(events.begin(), end, isWrite);
    if (mayHaveWritten || passing(operation, events[place], statementAt(events, place))) return;
    if (goesOn(operation, statementAt(events, place))) return;
    EXPECT_EQ(ground.tables(), before);
    const Outcome again = call();
    EXPECT_TRUE(again.positive) << "nothing stands in the way of a second try: " << again.errDescription;
    EXPECT_EQ(ground.counts(), counts_) << "which leaves what a first one does";
  }

  Lines counts_;  // after an undisturbed call
  FakeClock clock_{Date(2024, 3, 7, 10, 0, 0)};
};

TEST_P(EveryOperation, ReportsTheFailureOfEachStepAndLeavesNothingHalfDone) {
  const Lines events = undisturbed();
  ASSERT_FALSE(events.empty());
  for (std::size_t place = 0; place < events.size() && !HasFatalFailure(); ++place) {
    SCOPED_TRACE("event " + std::to_string(place + 1) + ": " + events[place]);
    failAt(events, place);
  }
}

INSTANTIATE_TEST_SUITE_P(Faults, EveryOperation, testing::ValuesIn(operations()), [](const auto& operation) {
  String name;
  for (const char* c = operation.param.name; *c != '\0'; ++c) name += std::isalnum(*c) != 0 ? *c : '_';
  return name;
});

}  // namespace
}  // namespace QVSa::test
