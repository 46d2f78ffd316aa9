#include <gtest/gtest.h>

#include "tests/support/TestInstallation.h"

// Walks the road in C; null, or the step that failed.
extern "C" const char* walkRoad(const char* server);

namespace QVSa {
namespace {

TEST(Road, AProgramInCSignsAUserOnAndReadsWhatIsThere) {
  const test::TestInstallation installation;
  const char* const failed = walkRoad(installation.server().c_str());
  EXPECT_EQ(failed, nullptr) << failed;
}

}  // namespace
}  // namespace QVSa
