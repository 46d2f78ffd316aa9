#pragma once

#include <functional>
#include <string>
#include <vector>

#include "QVSa/values/Values.h"

namespace QVSa::test {

// One call of an operation, on an object that was made before.
struct Call {
  std::function<bool()> run;  // from `connect` on
  std::function<Long()> errNumber;
  std::function<String()> errDescription;
  std::function<bool()> isTrue;                         // whether that is so which a positive result says
  std::function<bool()> isWhole = [] { return true; };  // whether nothing is half done, whatever the result was
};

struct MemoryOperation {
  const char* name;
  std::function<Call(const std::string& server)> call;
};

// What the operations work on, in an installation as it is shipped.
void fillMemoryGround(const std::string& server);

const std::vector<MemoryOperation>& memoryOperations();

}  // namespace QVSa::test
