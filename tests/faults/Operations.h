#pragma once

#include <functional>
#include <vector>

#include "QVSa/values/Values.h"

namespace QVSa::test {

struct Outcome {
  bool positive;
  Long errNumber;
  String errDescription;
};

// One call of an operation, on an object that is made and loaded.
struct Call {
  std::function<bool()> run;
  std::function<Long()> errNumber;
  std::function<String()> errDescription;

  Outcome operator()() const {
    const bool positive = run();
    return {positive, errNumber(), errDescription()};
  }
};

// How a failure is told that comes with a statement of this beginning.
struct Report {
  String statement;
  String prefix;
  bool silent = false;
  Long number = 0;      // in place of the failure's
  bool goesOn = false;  // the operation does all the rest, and so writes
  String suffix{};
};

struct Operation {
  const char* name;
  // Makes the object and loads what the operation needs.
  std::function<Call(const String& server)> prepare;
  // The first that fits holds; without one the failure is told as it is.
  std::vector<Report> reports;
  // Whether it writes in one transaction: up to the commit nothing may have changed.
  bool atomic;
};

// What the library lets pass.
struct LetPass {
  const char* operation;
  const char* statement;
  bool reported;  // in errNumber, in spite of the positive result
  const char* reason;
  bool alone = false;  // the statement, but not the opening and the beginning before it
};

const std::vector<Operation>& operations();
const std::vector<LetPass>& letPass();

}  // namespace QVSa::test
