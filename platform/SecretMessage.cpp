#include "platform/SecretMessage.h"

#include <openssl/crypto.h>

#include "QVSa/values/Failure.h"
#include "platform/CodePage.h"
#include "platform/OpenSsl.h"
#include "platform/SecretMessageCipher.h"

namespace QVSa::platform {

namespace {

constexpr std::size_t ivSize = 8;
constexpr std::size_t saltSize = 16;

}  // namespace

String encryptText(const String& plain, const String& secret) {
  const OpenSslErrorsKept kept;
  return writeSealedText(sealText(plain, secret, randomBytes(ivSize), randomBytes(saltSize)));
}

std::optional<String> decrypt(const String& cipher, const String& secret) {
  const OpenSslErrorsKept kept;
  const std::optional<SealedText> sealed = readSealedText(cipher);
  return sealed ? openSealedText(*sealed, secret) : std::nullopt;
}

String decryptText(const String& cipher, const String& secret) {
  return cipher.empty() ? String() : decrypt(cipher, secret).value_or("");
}

String md5Hex(const String& text) {
  const OpenSslErrorsKept kept;
  AnsiText ansi = toAnsi(text);
  const SecretBytes bytes(ansi.bytes.begin(), ansi.bytes.end());
  clearSecret(ansi.bytes);
  if (!ansi.oneByteEach) throw runtimeFailure(number::overflow);
  const SecretBytes md5 = digest("MD5", bytes);
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
