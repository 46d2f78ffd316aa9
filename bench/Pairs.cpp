#include "bench/Pairs.h"

#include <algorithm>
#include <benchmark/benchmark.h>
#include <cstdio>
#include <map>
#include <vector>

namespace QVSa::bench {

namespace {

constexpr int rounds = 5;
constexpr const char* operationMark = "/operation";
constexpr const char* floorMark = "/floor";

std::vector<std::string>& names() {
  static std::vector<std::string> theNames;
  return theNames;
}

void add(const std::string& name, const Side& side) {
  benchmark::RegisterBenchmark(name.c_str(),
                               [side](benchmark::State& state) {
                                 const Call call = side();
                                 // What the first call compiles and caches is not what is asked for.
                                 call.run();
                                 if (call.undo) call.undo();
                                 for (auto _ : state) {
                                   call.run();
                                   if (!call.undo) continue;
                                   state.PauseTiming();
                                   call.undo();
                                   state.ResumeTiming();
                                 }
                               })
      ->Unit(benchmark::kMicrosecond)
      ->UseRealTime()
      ->Repetitions(rounds);
}

class TableReporter : public benchmark::BenchmarkReporter {
 public:
  bool ReportContext(const Context&) override { return true; }

  void ReportRuns(const std::vector<Run>& runs) override {
    for (const Run& run : runs) {
      if (run.run_type != Run::RT_Iteration) continue;
      const auto [best, first] = best_.emplace(run.run_name.function_name, run.GetAdjustedRealTime());
      if (!first) best->second = std::min(best->second, run.GetAdjustedRealTime());
    }
  }

  void Finalize() override {
    std::printf("%-46s %14s %14s %7s\n", "", "operation, us", "floor, us", "ratio");
    for (const std::string& name : names()) {
      const auto operation = best_.find(name + operationMark);
      const auto floor = best_.find(name + floorMark);
      if (operation == best_.end() || floor == best_.end()) continue;
      std::printf("%-46s %14.1f %14.1f %7.2f\n", name.c_str(), operation->second, floor->second,
                  operation->second / floor->second);
    }
  }

 private:
  std::map<std::string, double> best_;
};

}  // namespace

void addPair(const std::string& name, const Side& operation, const Side& floor) {
  names().push_back(name);
  add(name + operationMark, operation);
  add(name + floorMark, floor);
}

void runPairs() {
  TableReporter reporter;
  benchmark::RunSpecifiedBenchmarks(&reporter);
}

}  // namespace QVSa::bench
