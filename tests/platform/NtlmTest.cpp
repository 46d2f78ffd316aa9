#include <cstdio>
#include <gtest/gtest.h>
#include <unistd.h>

#include "platform/Ntlm.h"

namespace QVSa::platform {
namespace {

// What a process of its own prints, started with `environment` before its name.
String logonElsewhere(const String& environment, const String& arguments) {
  char self[4096] = {};
  if (readlink("/proc/self/exe", self, sizeof self - 1) < 0) return "no program";
  FILE* child = popen((environment + " '" + self + "' --ntlm-logon " + arguments).c_str(), "r");
  char line[64] = {};
  const bool read = std::fgets(line, sizeof line, child) != nullptr;
  pclose(child);
  return read ? line : "no answer";
}

TEST(NtlmTest, OnlyTheRightPasswordOfAKnownUserAndDomainPasses) {
  EXPECT_TRUE(ntlmLogon("ann", "CORP", "Secret-1"));
  EXPECT_TRUE(ntlmLogon("bert", "CORP", "Bert-\xC3\x84-1"));

  EXPECT_FALSE(ntlmLogon("ann", "CORP", "secret-1"));
  EXPECT_FALSE(ntlmLogon("ann", "CORP", "wrong"));
  EXPECT_FALSE(ntlmLogon("nobody", "CORP", "Secret-1"));
  EXPECT_FALSE(ntlmLogon("ann", "OTHER", "Secret-1"));
  EXPECT_FALSE(ntlmLogon("bert", "CORP", "Secret-1")) << "another user's";
}

TEST(NtlmTest, ATextThatIsMissingOrGoesOnBehindANulByteIsRefused) {
  EXPECT_FALSE(ntlmLogon("ann", "CORP", ""));
  EXPECT_FALSE(ntlmLogon("", "CORP", "Secret-1"));
  EXPECT_FALSE(ntlmLogon("ann", "", "Secret-1")) << "of whatever domain";
  const String behind("\0x", 2);
  EXPECT_FALSE(ntlmLogon("ann" + behind, "CORP", "Secret-1"));
  EXPECT_FALSE(ntlmLogon("ann", "CORP" + behind, "Secret-1"));
  EXPECT_FALSE(ntlmLogon("ann", "CORP", "Secret-1" + behind));
}

TEST(NtlmTest, WithoutTheMechanismOrItsUsersEveryAnswerIsFalse) {
  const String ann = "ann CORP Secret-1";
  EXPECT_EQ(logonElsewhere("", ann), "True\n");
  EXPECT_EQ(logonElsewhere("GSS_MECH_CONFIG=/dev/null", ann), "False\n");
  EXPECT_EQ(logonElsewhere("NTLM_USER_FILE=/dev/null", ann), "False\n");
}

}  // namespace
}  // namespace QVSa::platform
