#include "platform/OpenSsl.h"

#include <cerrno>
#include <new>
#include <openssl/crypto.h>
#include <openssl/err.h>
#include <openssl/evp.h>
#include <openssl/kdf.h>
#include <openssl/provider.h>

namespace QVSa::platform {

namespace {

using Context = OpenSslPointer<OSSL_LIB_CTX, OSSL_LIB_CTX_free>;
using Cipher = OpenSslPointer<EVP_CIPHER, EVP_CIPHER_free>;
using Digest = OpenSslPointer<EVP_MD, EVP_MD_free>;
using Mac = OpenSslPointer<EVP_MAC, EVP_MAC_free>;
using Kdf = OpenSslPointer<EVP_KDF, EVP_KDF_free>;

// DES lives without it; the other old ciphers do not. Want of memory may read as want of the module.
bool loadLegacy(OSSL_LIB_CTX* library) {
  errno = 0;
  if (OSSL_PROVIDER_load(library, "legacy") != nullptr) return true;
  return errno != ENOMEM && ERR_GET_REASON(ERR_peek_last_error()) != ERR_R_MALLOC_FAILURE;
}

// The first fetch of each kind reads lists that go with OpenSSL's own end.
bool fetchEachKind(OSSL_LIB_CTX* library) {
  return Cipher(EVP_CIPHER_fetch(library, "DES-EDE3-CBC", nullptr)) &&
         Digest(EVP_MD_fetch(library, "SHA2-256", nullptr)) && Mac(EVP_MAC_fetch(library, "HMAC", nullptr)) &&
         Kdf(EVP_KDF_fetch(library, "PBKDF2", nullptr));
}

OSSL_LIB_CTX* makeLibrary() {
  const OpenSslErrorsKept kept;
  if (OPENSSL_init_crypto(0, nullptr) != 1)
    throw Failure(number::internal, "QVSa", "OpenSSL could not start, or has ended with the program.");
  Context library(OSSL_LIB_CTX_new());
  const bool made = library && OSSL_PROVIDER_load(library.get(), "default") != nullptr && loadLegacy(library.get()) &&
                    fetchEachKind(library.get());
  if (!made) throw std::bad_alloc();
  return library.release();
}

}  // namespace

OSSL_LIB_CTX* openSslLibrary() {
  static OSSL_LIB_CTX* const library = makeLibrary();
  return library;
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

Failure openSslFailure() {
  Long reason = number::internal;
  while (const unsigned long code = ERR_get_error())
    if (ERR_GET_REASON(code) == ERR_R_MALLOC_FAILURE) reason = number::memory;
  return runtimeFailure(reason);
}

}  // namespace QVSa::platform
