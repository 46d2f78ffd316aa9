#pragma once

#include <chrono>

#include "QVSa/values/Values.h"

namespace QVSa::console {

// How far a long command is, on the standard error: a line that counts on a terminal, one line at the end elsewhere.
class Progress {
 public:
  Progress(String noun, std::size_t total);
  ~Progress();
  Progress(const Progress&) = delete;
  Progress& operator=(const Progress&) = delete;

  void step();

 private:
  void write() const;

  String noun_;
  std::size_t total_;
  std::size_t done_ = 0;
  bool onTerminal_;
  std::chrono::steady_clock::time_point start_ = std::chrono::steady_clock::now();
};

}  // namespace QVSa::console
