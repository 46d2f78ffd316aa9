#include "platform/OpenSsl.h"

#include <cerrno>
#include <new>
#include <openssl/crypto.h>
#include <openssl/err.h>
#include <openssl/evp.h>
#include <openssl/kdf.h>
#include <openssl/provider.h>

#include "QVSa/frame/Failure.h"

namespace QVSa::platform {

namespace {

using Context = OpenSslPointer<OSSL_LIB_CTX, OSSL_LIB_CTX_free>;
using Cipher = OpenSslPointer<EVP_CIPHER, EVP_CIPHER_free>;
using Digest = OpenSslPointer<EVP_MD, EVP_MD_free>;
using Mac = OpenSslPointer<EVP_MAC, EVP_MAC_free>;
using Kdf = OpenSslPointer<EVP_KDF, EVP_KDF_free>;

bool isRunning() { return OPENSSL_init_crypto(0, nullptr) == 1; }

// The first fetch of each kind reads lists that go with OpenSSL's own end.
bool fetchEachKind(OSSL_LIB_CTX* library) {
  return Cipher(EVP_CIPHER_fetch(library, "DES-EDE3-CBC", nullptr)) &&
         Digest(EVP_MD_fetch(library, "SHA2-256", nullptr)) && Mac(EVP_MAC_fetch(library, "HMAC", nullptr)) &&
         Kdf(EVP_KDF_fetch(library, "PBKDF2", nullptr));
}

OSSL_LIB_CTX* makeLibrary() {
  const OpenSslErrorsKept kept;
  if (!isRunning()) throw Failure(number::internal, "QVSa", "OpenSSL could not start, or has ended with the program.");
  Context library(OSSL_LIB_CTX_new());
  const bool made = library && OSSL_PROVIDER_load(library.get(), "default") != nullptr && fetchEachKind(library.get());
  if (!made) throw std::bad_alloc();
  return library.release();
}

// Want of memory may read as want of the module.
bool loadLegacy(OSSL_LIB_CTX* library) {
  const OpenSslErrorsKept kept;
  if (!isRunning()) return false;
  errno = 0;
  if (OSSL_PROVIDER_load(library, "legacy") != nullptr && Cipher(EVP_CIPHER_fetch(library, "RC4", nullptr)))
    return true;
  if (errno == ENOMEM || memoryWasShort()) throw std::bad_alloc();
  return false;
}

}  // namespace

OSSL_LIB_CTX* openSslLibrary() {
  static OSSL_LIB_CTX* const library = makeLibrary();
  return library;
}

// Not before one of these ciphers is wanted: OpenSSL 3.0 does not survive want of memory while it loads this module.
bool loadOldCiphers() {
  static const bool loaded = loadLegacy(openSslLibrary());
  return loaded;
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
