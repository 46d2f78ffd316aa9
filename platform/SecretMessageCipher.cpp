#include "platform/SecretMessageCipher.h"

#include <limits>
#include <memory>
#include <new>
#include <openssl/evp.h>

#include "QVSa/values/Failure.h"
#include "platform/OpenSsl.h"
#include "platform/RandomBytes.h"

namespace QVSa::platform {

namespace {

constexpr std::size_t desKeySize = 8;
constexpr std::size_t fullKeySize = 16;
constexpr std::size_t hashBlockSize = 64;

struct FreeCipher {
  void operator()(EVP_CIPHER* cipher) const { EVP_CIPHER_free(cipher); }
  void operator()(EVP_CIPHER_CTX* context) const { EVP_CIPHER_CTX_free(context); }
};
using Cipher = std::unique_ptr<EVP_CIPHER, FreeCipher>;
using CipherContext = std::unique_ptr<EVP_CIPHER_CTX, FreeCipher>;

struct CipherKey {
  const char* cipher;
  SecretBytes key;
  int effectiveBits = 0;  // of RC2 only
  OSSL_LIB_CTX* library = openSslLibrary();
};

SecretBytes secretHash(const String& secret, const Bytes& salt) {
  const SecretBytes password = toUtf16Bytes(secret);
  SecretBytes data;
  data.reserve(password.size() + salt.size());
  data.insert(data.end(), password.begin(), password.end());
  data.insert(data.end(), salt.begin(), salt.end());
  return digest("SHA1", data);
}

// 40 bytes, for keys longer than the hash.
SecretBytes extended(const SecretBytes& hash) {
  SecretBytes result;
  for (const int pad : {0x36, 0x5C}) {
    SecretBytes block(hash);
    block.resize(hashBlockSize);
    for (std::uint8_t& byte : block) byte = static_cast<std::uint8_t>(byte ^ pad);
    const SecretBytes half = digest("SHA1", block);
    result.insert(result.end(), half.begin(), half.end());
  }
  return result;
}

SecretBytes firstBytes(const SecretBytes& bytes, std::size_t count) {
  return {bytes.begin(), bytes.begin() + static_cast<std::ptrdiff_t>(count)};
}

// DES as triple DES with three equal keys, which needs no old provider.
CipherKey desKey(const SecretBytes& hash) {
  const SecretBytes once = firstBytes(hash, desKeySize);
  SecretBytes key;
  for (int i = 0; i < 3; ++i) key.insert(key.end(), once.begin(), once.end());
  return {"DES-EDE3-CBC", key};
}

// The keys of RC2 and RC4. At 40 bits some writers fill the key up with zeros and some do not: two keys to try.
std::vector<CipherKey> variableKeys(const char* cipher, const SecretBytes& hash, Long bits) {
  const bool known = bits == 40 || bits == 56 || bits == 128;
  OSSL_LIB_CTX* const library = known ? openSslOldCiphers() : nullptr;
  if (library == nullptr) return {};
  std::vector<CipherKey> keys{{cipher, firstBytes(hash, static_cast<std::size_t>(bits / 8)), bits, library}};
  if (bits == 40) {
    keys.push_back(keys.front());
    keys.back().key.resize(fullKeySize);
  }
  return keys;
}

std::vector<CipherKey> keysOf(const SealedText& sealed, const String& secret) {
  const SecretBytes hash = secretHash(secret, sealed.salt);
  switch (sealed.algorithm) {
    case algorithm::des:
      return {desKey(hash)};
    case algorithm::tripleDes:
      return {{"DES-EDE3-CBC", firstBytes(extended(hash), 24)}};
    case algorithm::rc2:
      return variableKeys("RC2-CBC", hash, sealed.keyLength);
    case algorithm::rc4:
      return variableKeys("RC4", hash, sealed.keyLength);
    case algorithm::aes128:
      return {{"AES-128-CBC", firstBytes(extended(hash), 16)}};
    case algorithm::aes192:
      return {{"AES-192-CBC", firstBytes(extended(hash), 24)}};
    case algorithm::aes256:
      return {{"AES-256-CBC", firstBytes(extended(hash), 32)}};
    default:
      return {};
  }
}

// The ciphers are there and are given what they take: what fails has no memory.
void require(bool done) {
  if (!done) throw std::bad_alloc();
}

// Nothing for an iv of another length than the cipher's.
CipherContext startCipher(const CipherKey& key, const Bytes& iv, bool encrypt) {
  const Cipher cipher(EVP_CIPHER_fetch(key.library, key.cipher, nullptr));
  CipherContext context(EVP_CIPHER_CTX_new());
  require(cipher && context);
  if (static_cast<std::size_t>(EVP_CIPHER_get_iv_length(cipher.get())) != iv.size()) return nullptr;
  const int direction = encrypt ? 1 : 0;
  require(EVP_CipherInit_ex2(context.get(), cipher.get(), nullptr, nullptr, direction, nullptr) == 1);
  require(EVP_CIPHER_CTX_set_key_length(context.get(), static_cast<int>(key.key.size())) == 1);
  if (key.effectiveBits != 0 && EVP_CIPHER_is_a(cipher.get(), "RC2-CBC") == 1)
    require(EVP_CIPHER_CTX_ctrl(context.get(), EVP_CTRL_SET_RC2_KEY_BITS, key.effectiveBits, nullptr) > 0);
  const unsigned char* ivData = iv.empty() ? nullptr : iv.data();
  require(EVP_CipherInit_ex2(context.get(), nullptr, key.key.data(), ivData, direction, nullptr) == 1);
  return context;
}

// All of the input through the cipher; nothing where the iv or the padding does not read.
template <typename Input>
std::optional<SecretBytes> runCipher(const CipherKey& key, const Bytes& iv, const Input& input, bool encrypt) {
  if (input.size() > std::numeric_limits<int>::max() - EVP_MAX_BLOCK_LENGTH) throw runtimeFailure(number::overflow);
  const CipherContext context = startCipher(key, iv, encrypt);
  if (!context) return std::nullopt;
  SecretBytes output(input.size() + EVP_MAX_BLOCK_LENGTH);
  int length = 0;
  int restLength = 0;
  require(EVP_CipherUpdate(context.get(), output.data(), &length, input.data(), static_cast<int>(input.size())) == 1);
  // The last step asks for no memory: what it refuses is the padding.
  if (EVP_CipherFinal_ex(context.get(), output.data() + length, &restLength) != 1) return std::nullopt;
  output.resize(static_cast<std::size_t>(length) + static_cast<std::size_t>(restLength));
  return output;
}

}  // namespace

SecretBytes digest(const char* name, const SecretBytes& data) {
  SecretBytes result(EVP_MAX_MD_SIZE);
  std::size_t size = 0;
  require(EVP_Q_digest(openSslLibrary(), name, nullptr, data.data(), data.size(), result.data(), &size) == 1);
  result.resize(size);
  return result;
}

SealedText sealText(const String& plain, const String& secret, const Bytes& iv, const Bytes& salt) {
  const CipherKey key = desKey(secretHash(secret, salt));
  const std::optional<SecretBytes> cipherText = runCipher(key, iv, toUtf16Bytes(plain), true);
  require(cipherText.has_value());
  return SealedText{algorithm::des, 64, iv, salt, Bytes(cipherText->begin(), cipherText->end())};
}

std::optional<String> openSealedText(const SealedText& sealed, const String& secret) {
  for (const CipherKey& key : keysOf(sealed, secret)) {
    const std::optional<SecretBytes> bytes = runCipher(key, sealed.iv, sealed.cipherText, false);
    if (!bytes) continue;
    if (std::optional<String> text = fromUtf16Bytes(*bytes)) return text;
  }
  return std::nullopt;
}

Bytes randomBytes(std::size_t count) {
  Bytes bytes(count);
  fillRandom(bytes);
  return bytes;
}

}  // namespace QVSa::platform
