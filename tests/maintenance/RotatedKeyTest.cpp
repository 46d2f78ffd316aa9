#include <gtest/gtest.h>

#include "QVSa/frame/DeploymentSecrets.h"
#include "QVSa/maintenance/internal/RotatedKey.h"

namespace QVSa {
namespace {

TEST(RotatedKey, BeginsAtTheStartThatIsForcedIntoItsRange) {
  const String all(secrets::rotatedKeyCharacters.begin(), secrets::rotatedKeyCharacters.end());
  const std::pair<Integer, std::size_t> cases[] = {{0, 0}, {3, 3}, {9, 9}, {-1, 0}, {12, 9}};
  for (const auto& [start, first] : cases) EXPECT_EQ(rotatedKey(start), all.substr(first) + all.substr(0, first));
}

}  // namespace
}  // namespace QVSa
