#pragma once

#include "bench/Storage.h"

namespace QVSa::bench {

// Numbers of dated rules without reuse, issued by hand.
class NumberFloor {
 public:
  NumberFloor(const Storage& storage, const std::string& database);

  std::string newId(const std::string& rule);

 private:
  Query rule_;
  Query last_;
  Query write_;
  Query begin_;
  Query commit_;
};

}  // namespace QVSa::bench
