#include <memory>

#include "QVSa/QVSa.h"
#include "bench/NumberFloor.h"
#include "bench/Office.h"
#include "bench/Operations.h"
#include "bench/Pairs.h"

namespace QVSa::bench {

namespace {

struct OpenFloor {
  Storage storage{office().folder()};
  NumberFloor numbers{storage, "QVApp"};
};

Call issue() {
  auto numbers = std::make_shared<IdMgr>();
  numbers->connect(office().server(), "QVApp");
  return {[numbers] { require(!numbers->newId(Office::rule).empty(), *numbers); }};
}

Call issueFloor() {
  return {[floor = std::make_shared<OpenFloor>()] { floor->numbers.newId(Office::rule); }};
}

}  // namespace

void addNumberPairs() { addPair("IdMgr.newId, rule by day", issue, issueFloor); }

}  // namespace QVSa::bench
