#include "console/Waiting.h"

#include <cstdio>
#include <unistd.h>

namespace QVSa::console {

namespace {

constexpr std::size_t width = 20;
constexpr std::size_t markWidth = 4;
constexpr std::chrono::milliseconds pace{80};

// To the right end and back again.
String barAt(std::size_t tick) {
  const std::size_t way = width - markWidth;
  const std::size_t step = tick % (2 * way);
  String bar(width, '.');
  bar.replace(step < way ? step : 2 * way - step, markWidth, markWidth, '=');
  return "[" + bar + "]";
}

}  // namespace

Waiting::Waiting(String what) : what_(std::move(what)) {
  if (isatty(STDERR_FILENO) != 0) drawer_ = std::thread([this] { draw(); });
}

Waiting::~Waiting() {
  {
    const std::lock_guard lock(mutex_);
    isOver_ = true;
  }
  over_.notify_one();
  const bool drawn = drawer_.joinable();
  if (drawn) drawer_.join();
  const std::chrono::duration<double> passed = std::chrono::steady_clock::now() - start_;
  std::fprintf(stderr, "%s%s: %.1f s\n", drawn ? "\r\033[K" : "", what_.c_str(), passed.count());
}

void Waiting::draw() {
  std::unique_lock lock(mutex_);
  for (std::size_t tick = 0; !over_.wait_for(lock, pace, [this] { return isOver_; }); ++tick) {
    const std::chrono::duration<double> passed = std::chrono::steady_clock::now() - start_;
    std::fprintf(stderr, "\r%s %s %.1f s", what_.c_str(), barAt(tick).c_str(), passed.count());
  }
}

}  // namespace QVSa::console
