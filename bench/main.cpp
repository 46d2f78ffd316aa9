#include <benchmark/benchmark.h>
#include <cstdio>
#include <exception>

#include "bench/Operations.h"
#include "bench/Pairs.h"

int main(int argc, char** argv) {
  benchmark::Initialize(&argc, argv);
  if (benchmark::ReportUnrecognizedArguments(argc, argv)) return 2;
  try {
    QVSa::bench::addUserPairs();
    QVSa::bench::addNumberPairs();
    QVSa::bench::addDepartmentPairs();
    QVSa::bench::addOrganisationPairs();
    QVSa::bench::addLogPairs();
    QVSa::bench::addClassPairs();
    QVSa::bench::addHomePairs();
    QVSa::bench::addMaintenancePairs();
    QVSa::bench::runPairs();
    QVSa::bench::tellLogFacts();
    return 0;
  } catch (const std::exception& failure) {
    std::fprintf(stderr, "%s\n", failure.what());
    return 1;
  }
}
