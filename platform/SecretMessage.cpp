#include "platform/SecretMessage.h"

#include <openssl/err.h>

#include "QVSa/frame/Failure.h"
#include "platform/CodePage.h"
#include "platform/SecretMessageCipher.h"

namespace QVSa::platform {

namespace {

constexpr std::size_t ivSize = 8;
constexpr std::size_t saltSize = 16;

// Keeps our failures out of the thread's queue of OpenSSL errors, which a host reads for its own calls.
class ErrorQueueKept {
 public:
  ErrorQueueKept() { ERR_set_mark(); }
  ErrorQueueKept(const ErrorQueueKept&) = delete;
  ErrorQueueKept& operator=(const ErrorQueueKept&) = delete;
  ~ErrorQueueKept() { ERR_pop_to_mark(); }
};

}  // namespace

String encryptText(const String& plain, const String& secret) {
  const ErrorQueueKept kept;
  const Bytes iv = randomBytes(ivSize);
  const Bytes salt = randomBytes(saltSize);
  if (iv.empty() || salt.empty()) return {};
  const std::optional<SealedText> sealed = sealText(plain, secret, iv, salt);
  return sealed ? writeSealedText(*sealed) : String();
}

String decryptText(const String& cipher, const String& secret) {
  if (cipher.empty()) return {};
  const ErrorQueueKept kept;
  const std::optional<SealedText> sealed = readSealedText(cipher);
  return sealed ? openSealedText(*sealed, secret) : String();
}

String md5Hex(const String& text) {
  const ErrorQueueKept kept;
  AnsiText ansi = toAnsi(text);
  const SecretBytes bytes(ansi.bytes.begin(), ansi.bytes.end());
  clearSecret(ansi.bytes);
  if (!ansi.oneByteEach) throw runtimeFailure(number::overflow);
  const SecretBytes md5 = digest("MD5", bytes);
  if (md5.empty()) throw runtimeFailure(number::internal);
  String hex;
  for (const std::uint8_t byte : md5) {
    hex += "0123456789ABCDEF"[byte >> 4];
    hex += "0123456789ABCDEF"[byte & 0x0F];
  }
  return hex;
}

void clearSecret(String& secret) {
  OPENSSL_cleanse(secret.data(), secret.size());
  secret.clear();
}

}  // namespace QVSa::platform
