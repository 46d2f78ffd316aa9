#pragma once

#include <memory>
#include <openssl/types.h>
#include <vector>

#include "QVSa/values/Values.h"

namespace QVSa::platform {

// OpenSSL in contexts of the library's own: a host's providers and settings are neither used nor changed. Made at the
// first call and never let go: what they hold works on after OpenSSL's own end, for a caller who comes with the last
// statics of a program. Random numbers would not. Both throw std::bad_alloc; the next call tries again.

// The default provider: DES-EDE3-CBC, AES-128-CBC to AES-256-CBC, SHA1, SHA2-256, MD5, HMAC and PBKDF2. Throws Failure
// 51 as well, where OpenSSL ended before the first call, or never could start.
OSSL_LIB_CTX* openSslLibrary();
// The legacy provider: RC2-CBC and RC4. Null where the system lacks it, or OpenSSL ended before the first call.
OSSL_LIB_CTX* openSslOldCiphers();

// What OpenSSL made and `release` frees.
template <auto release>
struct FreeBy {
  template <typename Object>
  void operator()(Object* object) const {
    release(object);
  }
};
template <typename Object, auto release>
using OpenSslPointer = std::unique_ptr<Object, FreeBy<release>>;

// Keeps our failures out of the thread's queue of OpenSSL errors, which a host reads for its own calls: while this
// lives the queue holds only ours, afterwards what it held before.
class OpenSslErrorsKept {
 public:
  OpenSslErrorsKept();
  OpenSslErrorsKept(const OpenSslErrorsKept&) = delete;
  OpenSslErrorsKept& operator=(const OpenSslErrorsKept&) = delete;
  ~OpenSslErrorsKept();

 private:
  struct Error {
    unsigned long code;
    String file;
    int line;
    String function;
    String data;
  };
  std::vector<Error> hosts_;
};

// Whether OpenSSL has just refused for want of memory, by the errors in the thread's queue.
bool memoryWasShort();

}  // namespace QVSa::platform
