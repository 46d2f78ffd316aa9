#include <cstdlib>
#include <gtest/gtest.h>

#include "platform/Services.h"

namespace QVSa::platform {
namespace {

TEST(Services, TellTheLocalTimeOfTheMachine) {
  const char* old = std::getenv("TZ");
  const String kept = old == nullptr ? "" : old;
  const auto at = [](const char* zone) {
    setenv("TZ", zone, 1);
    tzset();
    return services().localTime().days();
  };
  // East of Greenwich the name's sign is a minus.
  const double difference = at("<EAST>-5:30") - at("<WEST>5");
  EXPECT_NEAR(difference, 10.5 / 24, 1.0 / 24 / 60);
  const double now = 25569 + static_cast<double>(std::time(nullptr)) / 86400;
  EXPECT_NEAR(at("UTC0"), now, 1.0 / 24 / 60);
  old == nullptr ? unsetenv("TZ") : setenv("TZ", kept.c_str(), 1);
  tzset();
}

}  // namespace
}  // namespace QVSa::platform
