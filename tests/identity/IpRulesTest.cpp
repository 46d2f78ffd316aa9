#include <gtest/gtest.h>

#include "QVSa/identity/internal/IpRules.h"

namespace QVSa {
namespace {

TEST(IpRules, AFullAddressMatchesItselfAndBlanksDoNotCount) {
  EXPECT_TRUE(ipMatchesOne("10.0.0.5", " 10.0. 0.5 "));
  EXPECT_FALSE(ipMatchesOne("10.0.0.5", "10.0.0.50"));
  EXPECT_TRUE(ipMatchesOne("fe80::1", "fe80::1"));
  EXPECT_FALSE(ipMatchesOne("fe80::1", "10.0.0.*"));
  EXPECT_FALSE(ipMatchesOne("10.0.0.5", "*"));
}

TEST(IpRules, AStarStandsForTheLastPartOnly) {
  EXPECT_TRUE(ipMatchesOne("10.0.0.5", "10.0.0.*"));
  EXPECT_FALSE(ipMatchesOne("10.0.0.5", "10.0.1.*"));
  EXPECT_FALSE(ipMatchesOne("10.0.0.5", "10.0.*.5"));
  EXPECT_FALSE(ipMatchesOne("10.0.0.5", "10.0.0.5*"));
}

TEST(IpRules, ARangeHoldsBothItsEnds) {
  for (const char* inside : {"10.0.0.1", "10.0.0.5", "10.0.0.9"}) EXPECT_TRUE(ipMatchesOne(inside, "10.0.0.1-9"));
  for (const char* outside : {"10.0.0.0", "10.0.0.10", "10.0.1.5"}) EXPECT_FALSE(ipMatchesOne(outside, "10.0.0.1-9"));
  // Numbers, not texts: 9 lies below 10.
  EXPECT_TRUE(ipMatchesOne("10.0.0.10", "10.0.0.9-11"));
  for (const char* broken : {"10.0.0.-", "10.0.0.1-", "10.0.0.-9", "10.0.0.1-9-12", "10.0.0.a-z"}) {
    EXPECT_FALSE(ipMatchesOne("10.0.0.5", broken)) << broken;
  }
}

TEST(IpRules, OneMatchingPatternOfTheListIsEnoughAndAnEmptyListPermitsNothing) {
  EXPECT_TRUE(ipMatches("10.0.0.5", "192.168.1.*|10.0.0.1-9"));
  EXPECT_FALSE(ipMatches("10.0.0.15", "192.168.1.*|10.0.0.1-9"));
  EXPECT_FALSE(ipMatches("", ""));
}

}  // namespace
}  // namespace QVSa
