#pragma once

#include <memory>
#include <openssl/types.h>
#include <vector>

#include "QVSa/frame/Values.h"

namespace QVSa::platform {

// OpenSSL with its default provider in a context of the library's own: a host's providers and settings are neither used
// nor changed. Made at the first call and never let go: its ciphers, digests, MACs and KDFs work on after OpenSSL's own
// end, for a caller who comes with the last statics of a program. Its random numbers do not. Throws std::bad_alloc, and
// Failure 51 where OpenSSL ended before the first call, or never could start; the next call tries again.
OSSL_LIB_CTX* openSslLibrary();
// Loads the legacy provider into that context, which RC2 and RC4 need. False where the system lacks it. Throws
// std::bad_alloc.
bool loadOldCiphers();

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
