#pragma once

#include <ldap.h>

namespace QVSa::platform {

// Ends the connections of an LDAP handle whose server stays silent. The client library has limits of its own, but none
// for a TLS handshake: there it would try for ever.
class SilenceLimit {
 public:
  explicit SilenceLimit(int seconds);
  SilenceLimit(const SilenceLimit&) = delete;
  SilenceLimit& operator=(const SilenceLimit&) = delete;

  // For each wait of `handle` from its next connection on; the limit has to live longer than the handle. An LDAP result
  // code.
  int watch(LDAP* handle);

 private:
  int seconds_;
  ldap_conncb callbacks_;
};

}  // namespace QVSa::platform
