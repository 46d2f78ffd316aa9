#include "platform/OpenSsl.h"

#include <algorithm>
#include <cerrno>
#include <initializer_list>
#include <new>
#include <openssl/crypto.h>
#include <openssl/err.h>
#include <openssl/evp.h>
#include <openssl/kdf.h>
#include <openssl/provider.h>

#include "QVSa/values/Failure.h"

namespace QVSa::platform {

namespace {

using Context = OpenSslPointer<OSSL_LIB_CTX, OSSL_LIB_CTX_free>;
using Cipher = OpenSslPointer<EVP_CIPHER, EVP_CIPHER_free>;
using Digest = OpenSslPointer<EVP_MD, EVP_MD_free>;
using Mac = OpenSslPointer<EVP_MAC, EVP_MAC_free>;
using Kdf = OpenSslPointer<EVP_KDF, EVP_KDF_free>;

bool isRunning() { return OPENSSL_init_crypto(0, nullptr) == 1; }

// Null where it could not be made.
Context contextWith(const char* provider) {
  Context context(OSSL_LIB_CTX_new());
  return context && OSSL_PROVIDER_load(context.get(), provider) != nullptr ? std::move(context) : nullptr;
}

// The first fetch of a kind makes all methods of that kind, by lists that go with OpenSSL's own end. One for which the
// memory was short is missing from the context for good, without a word: a context is kept where it has them all.
bool hasCiphers(OSSL_LIB_CTX* context, std::initializer_list<const char*> names) {
  return std::ranges::all_of(
      names, [&](const char* name) { return Cipher(EVP_CIPHER_fetch(context, name, nullptr)) != nullptr; });
}

bool hasDigests(OSSL_LIB_CTX* context, std::initializer_list<const char*> names) {
  return std::ranges::all_of(names,
                             [&](const char* name) { return Digest(EVP_MD_fetch(context, name, nullptr)) != nullptr; });
}

OSSL_LIB_CTX* makeLibrary() {
  const OpenSslErrorsKept kept;
  if (!isRunning()) throw Failure(number::internal, "QVSa", "OpenSSL could not start, or has ended with the program.");
  Context library = contextWith("default");
  const bool complete =
      library && hasCiphers(library.get(), {"DES-EDE3-CBC", "AES-128-CBC", "AES-192-CBC", "AES-256-CBC"}) &&
      hasDigests(library.get(), {"SHA1", "SHA2-256", "MD5"}) && Mac(EVP_MAC_fetch(library.get(), "HMAC", nullptr)) &&
      Kdf(EVP_KDF_fetch(library.get(), "PBKDF2", nullptr));
  if (!complete) throw std::bad_alloc();
  return library.release();
}

// Want of memory may read as want of the module.
OSSL_LIB_CTX* makeOldCiphers() {
  const OpenSslErrorsKept kept;
  if (!isRunning()) return nullptr;
  errno = 0;
  Context context = contextWith("legacy");
  if (context && hasCiphers(context.get(), {"RC2-CBC", "RC4"})) return context.release();
  if (context || errno == ENOMEM || memoryWasShort()) throw std::bad_alloc();
  return nullptr;
}

}  // namespace

OSSL_LIB_CTX* openSslLibrary() {
  static OSSL_LIB_CTX* const library = makeLibrary();
  return library;
}

// Not before one of these ciphers is wanted: OpenSSL 3.0 does not survive want of memory while it loads this module.
OSSL_LIB_CTX* openSslOldCiphers() {
  static OSSL_LIB_CTX* const ciphers = makeOldCiphers();
  return ciphers;
}

OpenSslErrorsKept::OpenSslErrorsKept() {
  Error error{};
  const char* file = nullptr;
  const char* function = nullptr;
  const char* data = nullptr;
  int flags = 0;
  while ((error.code = ERR_get_error_all(&file, &error.line, &function, &data, &flags)) != 0) {
    error.file = file;
    error.function = function;
    error.data = (flags & ERR_TXT_STRING) != 0 ? data : "";
    hosts_.push_back(error);
  }
}

OpenSslErrorsKept::~OpenSslErrorsKept() {
  ERR_clear_error();
  for (const Error& error : hosts_) {
    ERR_new();
    ERR_set_debug(error.file.c_str(), error.line, error.function.c_str());
    ERR_set_error(ERR_GET_LIB(error.code), ERR_GET_REASON(error.code), "%s", error.data.c_str());
  }
}

bool memoryWasShort() {
  // An error that left no trace found no memory for it.
  bool isShort = ERR_peek_error() == 0;
  while (const unsigned long code = ERR_get_error()) isShort = isShort || ERR_GET_REASON(code) == ERR_R_MALLOC_FAILURE;
  return isShort;
}

}  // namespace QVSa::platform
