#include <algorithm>
#include <cstdlib>
#include <cstring>
#include <fstream>
#include <gtest/gtest.h>
#include <iterator>
#include <limits>
#include <sys/mman.h>

#include "providers/embedded/storage/Pool.h"
#include "tests/embedded/ChildProcess.h"
#include "tests/memory/FailingAllocator.h"
#include "tests/memory/Operations.h"
#include "tests/support/TestInstallation.h"

namespace QVSa::test {

namespace {

using embedded::ChildProcess;

// Whether the process has used the library before the call whose memory is short.
enum class Process { cold, warm };

struct Case {
  MemoryOperation operation;
  Process process;
  Shortage shortage;
};

std::string nameOf(const Case& tried) {
  return std::string(tried.operation.name) + (tried.process == Process::cold ? "Cold" : "Warm") +
         (tried.shortage == Shortage::once ? "Once" : "Lasting");
}

void PrintTo(const Case& tried, std::ostream* out) { *out << nameOf(tried); }

std::vector<Case> cases() {
  std::vector<Case> result;
  for (const auto& operation : memoryOperations())
    for (const Process process : {Process::cold, Process::warm})
      for (const Shortage shortage : {Shortage::once, Shortage::lasting})
        result.push_back({operation, process, shortage});
  return result;
}

// What a child tells its parent, also where it dies.
struct Told {
  std::size_t tried;
  char complaint[1000];
};

Told& told() {
  static void* const shared = ::mmap(nullptr, sizeof(Told), PROT_READ | PROT_WRITE, MAP_SHARED | MAP_ANONYMOUS, -1, 0);
  return *static_cast<Told*>(shared);
}

// Empty where a call that was short of memory kept its word.
std::string complaintOf(const Call& call, long first, Shortage shortage) {
  bool positive = false;
  bool left = false;
  {
    const FailingAllocations failing(first, shortage);
    try {
      positive = call.run();
    } catch (...) {
      left = true;
    }
  }
  if (left) return "an exception left it";
  if (positive && !call.isTrue()) return "True that is not so";
  if (!positive && (call.errNumber() != number::memory || !call.errDescription().ends_with("Out of memory")))
    return "it reads as " + std::to_string(call.errNumber()) + ": " + call.errDescription();
  return call.isWhole() ? "" : "something is half done";
}

std::string complaintOf(const Call& undisturbed) {
  if (!undisturbed.run())
    return "the next call fails: " + std::to_string(undisturbed.errNumber()) + ": " + undisturbed.errDescription();
  return undisturbed.isTrue() && undisturbed.isWhole() ? "" : "the next call is wrong";
}

// Everything happens in children of a process that has used nothing of the library itself.
class WantOfMemory : public testing::TestWithParam<Case> {
 protected:
  WantOfMemory() {
    std::filesystem::copy(ground(), folder_.path());
    told() = {};
  }

  // The numbers of the allocations that ask for memory from different places.
  std::vector<long> places() const {
    const std::filesystem::path file = folder_.path() / "places";
    ChildProcess child([&] {
      warmUp();
      const Call undisturbed = call();
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
      warmUp();
      do {
        std::string complaint = complaintOf(call(), allocations[told().tried], GetParam().shortage);
        if (complaint.empty()) complaint = complaintOf(call());
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
  static const std::filesystem::path& ground() {
    static const TestFolder folder;
    static const int made = ChildProcess([] {
                              const TestInstallation installation;
                              fillMemoryGround(installation.server());
                              embedded::discardIdleHandle(installation.folder());
                              std::filesystem::copy(installation.folder(), folder.path());
                              return 0;
                            }).exitCode();
    EXPECT_EQ(made, 0);
    return folder.path();
  }

  Call call() const { return GetParam().operation.call("file:" + folder_.path().string()); }

  void warmUp() const {
    if (GetParam().process == Process::warm && !complaintOf(call()).empty())
      throw std::logic_error("the operation does not work");
  }

  TestFolder folder_;
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
