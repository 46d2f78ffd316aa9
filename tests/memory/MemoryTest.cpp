#include <algorithm>
#include <cctype>
#include <cstdlib>
#include <cstring>
#include <fstream>
#include <gtest/gtest.h>
#include <iterator>
#include <sys/mman.h>

#include "QVSa/values/Failure.h"
#include "tests/embedded/ChildProcess.h"
#include "tests/faults/Ground.h"
#include "tests/faults/Operations.h"
#include "tests/memory/FailingAllocator.h"

namespace QVSa::test {

namespace {

using embedded::ChildProcess;

// Whether the process has used the library before the call whose memory is short.
enum class Process { cold, warm };

struct Case {
  const char* operation;
  Process process;
  Shortage shortage;
};

const Operation& operationOf(const Case& tried) {
  return *std::ranges::find_if(operations(), [&](const auto& one) { return String(one.name) == tried.operation; });
}

std::string nameOf(const Case& tried) {
  std::string name = tried.operation;
  std::erase_if(name, [](char c) { return std::isalnum(static_cast<unsigned char>(c)) == 0; });
  return name + (tried.process == Process::cold ? "Cold" : "Warm") +
         (tried.shortage == Shortage::once ? "Once" : "Lasting");
}

void PrintTo(const Case& tried, std::ostream* out) { *out << nameOf(tried); }

std::vector<Case> cases() {
  std::vector<Case> result;
  for (const char* operation : {"Home.connect", "User.loginAuth", "User.loginAuth with a wrong password", "User.chgPwd",
                                "User.Save", "IdMgr.newId for a record", "LogRecords.Add", "LogRecords.saveLog",
                                "DBMgr.BackUpDB with a lock", "DBMgr.RestoreDB"})
    for (const Process process : {Process::cold, Process::warm})
      for (const Shortage shortage : {Shortage::once, Shortage::lasting})
        result.push_back({operation, process, shortage});
  return result;
}

// What a child tells its parent, also where it dies.
struct Told {
  std::size_t tablesBefore, countsBehind;  // of an undisturbed call
  bool writes;
  std::size_t tried;
  char complaint[1000];
};

std::size_t markOf(const Lines& lines) {
  std::string all;
  for (const String& line : lines) all += line + '\n';
  return std::hash<std::string>()(all);
}

Told& told() {
  static void* const shared = ::mmap(nullptr, sizeof(Told), PROT_READ | PROT_WRITE, MAP_SHARED | MAP_ANONYMOUS, -1, 0);
  return *static_cast<Told*>(shared);
}

// Everything happens in children of a process that has used nothing of the library itself.
class WantOfMemory : public testing::TestWithParam<Case> {
 protected:
  WantOfMemory() {
    told() = {};
    filled();  // once, and not by each child
    ChildProcess undisturbed([] {
      const Ground ground(filled());
      told().tablesBefore = markOf(ground.tables());
      const bool done = operationOf(GetParam()).prepare(ground.server())().positive;
      told().countsBehind = markOf(ground.counts());
      told().writes = markOf(ground.tables()) != told().tablesBefore;
      return done ? 0 : 1;
    });
    EXPECT_EQ(undisturbed.exitCode(), 0) << "the operation does not work";
  }

  // The numbers of the allocations that ask for memory from different places.
  std::vector<long> places() const {
    const TestFolder folder;
    const std::filesystem::path file = folder.path() / "places";
    ChildProcess child([&] {
      const Ground ground(filled());
      warmUp(ground);
      const Call undisturbed = operationOf(GetParam()).prepare(ground.server());
      startNoting();
      const bool done = undisturbed.run();
      const std::vector<long> allocations = stopNoting();
      if (!done) return 1;
      std::ofstream noted(file);
      for (const long number : allocations) noted << number << '\n';
      return 0;
    });
    EXPECT_EQ(child.exitCode(), 0);
    std::ifstream noted(file);
    return {std::istream_iterator<long>(noted), {}};
  }

  // Tries one allocation in a cold process, all that are left in a warm one. False where there is a complaint.
  bool tryNext(const std::vector<long>& allocations) {
    told().complaint[0] = '\0';
    ChildProcess child([&] {
      do {
        const std::string complaint = complaintOf(allocations[told().tried]);
        std::strncpy(told().complaint, complaint.c_str(), sizeof told().complaint - 1);
        if (!complaint.empty()) return 1;
        ++told().tried;
      } while (GetParam().process == Process::warm && told().tried < allocations.size());
      return 0;
    });
    const int code = child.exitCode();
    if (code == 0) return true;
    ADD_FAILURE() << "allocation " << allocations[told().tried] << ": "
                  << (code == 1 ? told().complaint : "the process died");
    ++told().tried;
    return false;
  }

 private:
  static const std::filesystem::path& filled() {
    static const TestFolder folder;
    static const int made = ChildProcess([] {
                              const TestInstallation installation;
                              fillGround(installation);
                              std::filesystem::copy(installation.folder(), folder.path());
                              return 0;
                            }).exitCode();
    EXPECT_EQ(made, 0);
    return folder.path();
  }

  // The handle that a session leaves behind is kept for the next one.
  static void warmUp(const Ground& ground) {
    if (GetParam().process == Process::warm) static_cast<void>(ground.counts());
  }

  // Empty where a call that was short of memory kept its word.
  static std::string complaintOf(long first) {
    const Ground ground(filled());
    warmUp(ground);
    const Call call = operationOf(GetParam()).prepare(ground.server());
    bool positive = false;
    {
      const FailingAllocations failing(first, GetParam().shortage);
      try {
        positive = call.run();
      } catch (...) {
        return "an exception left it";
      }
    }
    if (!positive && (call.errNumber() != number::memory || !call.errDescription().ends_with("Out of memory")))
      return "it reads as " + std::to_string(call.errNumber()) + ": " + call.errDescription();
    return complaintOfTables(ground, call, positive);
  }

  static std::string complaintOfTables(const Ground& ground, const Call& call, bool positive) {
    const bool hasWritten = markOf(ground.tables()) != told().tablesBefore;
    const bool isWhole = hasWritten == told().writes && markOf(ground.counts()) == told().countsBehind;
    if (positive) return isWhole ? "" : "True that is not so";
    // What was committed before stays, as where a statement fails.
    if (hasWritten) return "";
    if (!call.run()) return "the next call fails: " + call.errDescription();
    return markOf(ground.counts()) == told().countsBehind ? "" : "the next call is wrong";
  }
};

// So many as QVSA_ALLOCATIONS says, or "all", at even distances.
std::vector<long> sampleOf(const std::vector<long>& places) {
  const char* const wanted = std::getenv("QVSA_ALLOCATIONS");
  if (wanted != nullptr && std::string(wanted) == "all") return places;
  const std::size_t most = wanted == nullptr ? 20 : std::stoul(wanted);
  const std::size_t count = std::min(most, places.size());
  std::vector<long> sample;
  for (std::size_t i = 0; i < count; ++i) sample.push_back(places[i * places.size() / count]);
  return sample;
}

TEST_P(WantOfMemory, IsReportedAndLeavesNothingBehind) {
  constexpr std::size_t mostComplaints = 20;
  const std::vector<long> allocations = sampleOf(places());
  ASSERT_FALSE(allocations.empty());
  RecordProperty("allocations", static_cast<int>(allocations.size()));
  std::size_t complaints = 0;
  while (told().tried < allocations.size() && complaints < mostComplaints)
    if (!tryNext(allocations)) ++complaints;
}

INSTANTIATE_TEST_SUITE_P(Allocations, WantOfMemory, testing::ValuesIn(cases()),
                         [](const auto& tried) { return nameOf(tried.param); });

}  // namespace
}  // namespace QVSa::test

int main(int argc, char** argv) {
  QVSa::test::installFailingAllocator();
  testing::InitGoogleTest(&argc, argv);
  return RUN_ALL_TESTS();
}
