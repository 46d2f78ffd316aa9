#include "console/Progress.h"

#include <cstdio>
#include <unistd.h>

namespace QVSa::console {

Progress::Progress(String noun, std::size_t total)
    : noun_(std::move(noun)), total_(total), onTerminal_(isatty(STDERR_FILENO) != 0) {}

Progress::~Progress() {
  write();
  std::fputc('\n', stderr);
}

void Progress::step() {
  ++done_;
  constexpr std::size_t stride = 16;
  if (onTerminal_ && done_ % stride == 0) write();
}

void Progress::write() const {
  const std::chrono::duration<double> passed = std::chrono::steady_clock::now() - start_;
  std::fprintf(stderr, "%s%s: %zu of %zu, %.1f s", onTerminal_ ? "\r" : "", noun_.c_str(), done_, total_,
               passed.count());
  std::fflush(stderr);
}

}  // namespace QVSa::console
