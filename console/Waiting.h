#pragma once

#include <chrono>
#include <condition_variable>
#include <mutex>
#include <thread>

#include "QVSa/values/Values.h"

namespace QVSa::console {

// A bar that moves on the terminal's standard error, with the time that has passed, while one long call runs that tells
// nothing of how far it is. Elsewhere one line at the end.
class Waiting {
 public:
  explicit Waiting(String what);
  ~Waiting();
  Waiting(const Waiting&) = delete;
  Waiting& operator=(const Waiting&) = delete;

 private:
  void draw();

  String what_;
  std::chrono::steady_clock::time_point start_ = std::chrono::steady_clock::now();
  std::mutex mutex_;
  std::condition_variable over_;
  bool isOver_ = false;
  std::thread drawer_;
};

}  // namespace QVSa::console
