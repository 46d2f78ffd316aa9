#pragma once

#include <openssl/err.h>
#include <openssl/types.h>

namespace QVSa::platform {

// OpenSSL with its default and its legacy provider in a context of the library's own: a host's providers and settings
// are neither used nor changed. Made at the first call and never let go: its ciphers, digests and MACs work on after
// OpenSSL's own end, for a caller who comes with the last statics of a program. Its random numbers do not.
// Throws 7 for want of memory and 51 where OpenSSL ended before the first call, or never could start; the next call
// tries again.
OSSL_LIB_CTX* openSslLibrary();

// Keeps our failures out of the thread's queue of OpenSSL errors, which a host reads for its own calls.
class OpenSslErrorsKept {
 public:
  OpenSslErrorsKept() { ERR_set_mark(); }
  OpenSslErrorsKept(const OpenSslErrorsKept&) = delete;
  OpenSslErrorsKept& operator=(const OpenSslErrorsKept&) = delete;
  ~OpenSslErrorsKept() { ERR_pop_to_mark(); }
};

}  // namespace QVSa::platform
