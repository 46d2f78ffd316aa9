#pragma once

#include "platform/Services.h"

namespace QVSa::test {

// The machine's clock, standing where a test puts it; the embedded engine's getdate() is the same clock.
class FakeClock {
 public:
  explicit FakeClock(Date now) : before_(platform::services()) { set(now); }
  ~FakeClock() { platform::replaceServices(before_); }
  FakeClock(const FakeClock&) = delete;
  FakeClock& operator=(const FakeClock&) = delete;

  void set(Date now) {
    platform::Services services = platform::services();
    services.localTime = [now] { return now; };
    platform::replaceServices(services);
  }

 private:
  platform::Services before_;
};

}  // namespace QVSa::test
