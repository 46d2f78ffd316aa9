#pragma once

#include <memory>
#include <sys/types.h>

#include "QVSa/values/Values.h"
#include "tests/support/TestInstallation.h"

namespace QVSa::test {

// A directory server on the loopback device, an ordinary process with its configuration and data in a folder of its
// own:
//   dc=example,dc=org
//     cn=service                      password Reader-7
//     ou=people   uid=ann             password Secret-1; "Ann Example", ann@example.org
//                 uid=bob             "Bob (Sales) *\" of cn, no mail
//     ou=windows  cn=Carl             login carl by sAMAccountName, another one by uid
//                 cn=Dora             login dora@corp by userPrincipalName alone
//                 cn=box              a computer
//     ou=empty
//     ou=many     `many` users, more than one answer may hold
// Only those who are bound may read. It takes StartTLS, and TLS from the first byte on a port of its own. Its
// certificate, for 127.0.0.1, is what this process trusts if it asked no directory before the first server was made.
// Its ports stay its own until the object goes: at a server that was stopped nobody else answers.
class Slapd {
 public:
  static constexpr int many = 600;
  static bool isInstalled();

  Slapd();
  ~Slapd();
  Slapd(const Slapd&) = delete;
  Slapd& operator=(const Slapd&) = delete;

  Long port() const;
  Long tlsPort() const;
  // It keeps its connections open, takes new ones, and answers nothing.
  void hang() const;
  void goOn() const;
  void stop();

 private:
  class Port;
  bool answers() const;

  TestFolder folder_;
  std::unique_ptr<Port> port_;
  std::unique_ptr<Port> tlsPort_;
  pid_t process_ = 0;
};

}  // namespace QVSa::test

// Ends a test where the directory server is not installed.
#define QVSA_NEEDS_SLAPD() \
  if (!QVSa::test::Slapd::isInstalled()) GTEST_SKIP() << "slapd is not installed (tools/install-packages.sh does it)"
