#pragma once

#include <chrono>
#include <optional>

namespace QVSa::tsql {

// The moment after which work on a batch ends with the time-out. Whoever reads or walks through what may be long asks
// now and then; most calls cost a count.
class Deadline {
 public:
  using Moment = std::optional<std::chrono::steady_clock::time_point>;

  // None: no limit.
  explicit Deadline(Moment moment = std::nullopt) : moment_(moment) {}

  // Throws the time-out where the moment has passed.
  void check() {
    if (++calls_ % callsBetweenLooks == 0) look();
  }
  void look() const;

 private:
  static constexpr unsigned callsBetweenLooks = 1024;

  Moment moment_;
  unsigned calls_ = 0;
};

}  // namespace QVSa::tsql
