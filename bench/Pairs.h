#pragma once

#include <functional>
#include <string>

namespace QVSa::bench {

// The call that is measured, and what puts things back after it where that is needed. Both throw on failure.
struct Call {
  std::function<void()> run;
  std::function<void()> undo = {};
};

// One of the two sides of a pair: prepares what its call needs.
using Side = std::function<Call()>;

// Registers an operation of the library and its floor: the same rows read and written by hand-written statements on the
// SQLite, in as many commits, on the same files.
void addPair(const std::string& name, const Side& operation, const Side& floor);

// Runs all pairs, each side in several rounds, and prints the table of operation, floor and ratio. The fastest round of
// each side counts: what is above it is the machine's other work.
void runPairs();

}  // namespace QVSa::bench
