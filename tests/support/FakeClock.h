#pragma once

#include "platform/Services.h"

namespace QVSa::test {

// The machine's clock, standing where a test puts it; the embedded engine's getdate() is the same clock.
class FakeClock {
 public:
  explicit FakeClock(Date now) : before_(platform::services()) {
    ++standing_;
    set(now);
  }
  ~FakeClock() {
    platform::replaceServices(before_);
    --standing_;
  }
  FakeClock(const FakeClock&) = delete;
  FakeClock& operator=(const FakeClock&) = delete;

  static bool stands() { return standing_ > 0; }

  void set(Date now) {
    platform::Services services = platform::services();
    services.localTime = [now] { return now; };
    platform::replaceServices(services);
  }

 private:
  inline static int standing_ = 0;
  platform::Services before_;
};

}  // namespace QVSa::test
