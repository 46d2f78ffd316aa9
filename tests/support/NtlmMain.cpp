// The start of a test program whose NTLM mechanism has its own users. The mechanism finds their file by an environment
// variable that must stand before the process starts, hence the program starts itself again.
//   CORP: ann (Secret-1), bert (Bert-Ä-1)
// With three arguments behind --ntlm-logon it prints what ntlmLogon gives for them.

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <gtest/gtest.h>
#include <sys/mman.h>
#include <unistd.h>

#include "platform/Ntlm.h"

namespace {

constexpr const char* users = "CORP:ann:Secret-1\nCORP:bert:Bert-\xC3\x84-1\n";

void startWithUsers(char** argv) {
  const int file = memfd_create("ntlm-users", 0);
  if (file < 0 || write(file, users, std::strlen(users)) < 0) return;
  setenv("NTLM_USER_FILE", ("/proc/self/fd/" + std::to_string(file)).c_str(), 1);
  execv("/proc/self/exe", argv);
}

}  // namespace

// The mechanism loses some memory with each exchange. The leak checker finds it by whole call stacks.
extern "C" const char* __asan_default_options() { return "fast_unwind_on_malloc=0"; }
extern "C" const char* __lsan_default_suppressions() { return "leak:gssntlmssp.so\n"; }

int main(int argc, char** argv) {
  if (std::getenv("NTLM_USER_FILE") == nullptr) startWithUsers(argv);
  if (argc == 5 && std::strcmp(argv[1], "--ntlm-logon") == 0) {
    std::puts(QVSa::platform::ntlmLogon(argv[2], argv[3], argv[4]) ? "True" : "False");
    return 0;
  }
  ::testing::InitGoogleTest(&argc, argv);
  return RUN_ALL_TESTS();
}
