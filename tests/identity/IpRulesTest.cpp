#include <gtest/gtest.h>

#include "QVSa/identity/internal/IpRules.h"

namespace QVSa {
namespace {

TEST(IpRules, MatchOneAddressAStarForItsLastPartOrARangeThere) {
  const std::pair<const char*, const char*> matches[] = {{"10.0.0.5", " 10.0. 0.5 "}, {"fe80::1", "fe80::1"},
                                                         {"10.0.0.5", "10.0.0.*"},    {"10.0.0.1", "10.0.0.1-9"},
                                                         {"10.0.0.9", "10.0.0.1-9"},  {"10.0.0.10", "10.0.0.9-11"}};
  for (const auto& [address, rule] : matches) EXPECT_TRUE(ipMatchesOne(address, rule)) << address << " " << rule;
  for (const char* rule : {"10.0.0.50", "*", "10.0.1.*", "10.0.*.5", "10.0.0.5*", "10.0.0.6-9", "10.0.0.1-4",
                           "10.0.1.1-9", "10.0.0.-", "10.0.0.1-", "10.0.0.-9", "10.0.0.1-9-12", "10.0.0.a-z"})
    EXPECT_FALSE(ipMatchesOne("10.0.0.5", rule)) << rule;
  EXPECT_FALSE(ipMatchesOne("fe80::1", "10.0.0.*"));
}

TEST(IpRules, OneMatchingPatternOfTheListIsEnoughAndAnEmptyListPermitsNothing) {
  EXPECT_TRUE(ipMatches("10.0.0.5", "192.168.1.*|10.0.0.1-9"));
  EXPECT_FALSE(ipMatches("10.0.0.15", "192.168.1.*|10.0.0.1-9"));
  EXPECT_FALSE(ipMatches("", ""));
}

}  // namespace
}  // namespace QVSa
