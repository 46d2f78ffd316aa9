#include "platform/PasswordDigest.h"

#include <array>
#include <charconv>
#include <new>
#include <openssl/core_names.h>
#include <openssl/crypto.h>
#include <openssl/kdf.h>
#include <openssl/params.h>
#include <optional>
#include <string_view>

#include "platform/OpenSsl.h"
#include "platform/RandomBytes.h"

namespace QVSa::platform {

namespace {

constexpr std::string_view scheme = "pbkdf2-sha256";
constexpr int iterations = 20000;
// A digest that asks for more is none of ours, and would hold up a log-in.
constexpr int mostIterations = 10'000'000;
constexpr std::size_t saltSize = 16;
constexpr std::size_t digestSize = 32;

constexpr std::string_view alphabet = "ABCDEFGHJKLMNPQRSTUVWXYZabcdefghijkmnpqrstuvwxyz23456789";
constexpr std::size_t passwordLength = 20;

using Digest = std::array<std::uint8_t, digestSize>;

struct StoredDigest {
  int iterations = 0;
  Bytes salt;
  Bytes digest;
};

Digest derive(const String& password, const Bytes& salt, int rounds) {
  const OpenSslErrorsKept kept;
  const OpenSslPointer<EVP_KDF, EVP_KDF_free> kdf(EVP_KDF_fetch(openSslLibrary(), "PBKDF2", nullptr));
  const OpenSslPointer<EVP_KDF_CTX, EVP_KDF_CTX_free> context(EVP_KDF_CTX_new(kdf.get()));
  // Lent for reading only.
  const auto lend = [](const char* name, const auto& value) {
    return OSSL_PARAM_construct_octet_string(name, const_cast<char*>(reinterpret_cast<const char*>(value.data())),
                                             value.size());
  };
  char hash[] = "SHA2-256";
  const OSSL_PARAM parameters[] = {lend(OSSL_KDF_PARAM_PASSWORD, password), lend(OSSL_KDF_PARAM_SALT, salt),
                                   OSSL_PARAM_construct_int(OSSL_KDF_PARAM_ITER, &rounds),
                                   OSSL_PARAM_construct_utf8_string(OSSL_KDF_PARAM_DIGEST, hash, 0),
                                   OSSL_PARAM_construct_end()};
  Digest digest;
  if (!context || EVP_KDF_derive(context.get(), digest.data(), digest.size(), parameters) != 1) throw std::bad_alloc();
  return digest;
}

template <typename Range>
String toHex(const Range& bytes) {
  String hex;
  for (const std::uint8_t byte : bytes) {
    hex += "0123456789abcdef"[byte >> 4];
    hex += "0123456789abcdef"[byte & 0x0F];
  }
  return hex;
}

// Nothing for a text that is no number to its end.
template <typename Number>
std::optional<Number> readNumber(std::string_view text, int base) {
  Number value{};
  const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), value, base);
  if (error != std::errc() || end != text.data() + text.size()) return std::nullopt;
  return value;
}

std::optional<Bytes> fromHex(std::string_view hex) {
  if (hex.size() % 2 != 0) return std::nullopt;
  Bytes bytes;
  for (std::size_t at = 0; at < hex.size(); at += 2) {
    const auto byte = readNumber<std::uint8_t>(hex.substr(at, 2), 16);
    if (!byte) return std::nullopt;
    bytes.push_back(*byte);
  }
  return bytes;
}

// What stands before the next "$", which is cut off the text.
std::string_view takePart(std::string_view& text) {
  const std::size_t end = text.find('$');
  const std::string_view part = text.substr(0, end);
  text = end == std::string_view::npos ? std::string_view() : text.substr(end + 1);
  return part;
}

std::optional<StoredDigest> parseDigest(std::string_view text) {
  if (takePart(text) != scheme) return std::nullopt;
  const auto rounds = readNumber<int>(takePart(text), 10);
  const auto salt = fromHex(takePart(text));
  const auto digest = fromHex(text);
  if (!rounds || *rounds < 1 || *rounds > mostIterations) return std::nullopt;
  if (!salt || !digest || digest->size() != digestSize) return std::nullopt;
  return StoredDigest{*rounds, *salt, *digest};
}

}  // namespace

String makePasswordDigest(const String& password) {
  Bytes salt(saltSize);
  fillRandom(salt);
  return String(scheme) + "$" + std::to_string(iterations) + "$" + toHex(salt) + "$" +
         toHex(derive(password, salt, iterations));
}

bool passwordMatches(const String& password, const String& digest) {
  const auto stored = parseDigest(digest);
  if (!stored) return false;
  const Digest derived = derive(password, stored->salt, stored->iterations);
  return CRYPTO_memcmp(derived.data(), stored->digest.data(), digestSize) == 0;
}

String makePassword() {
  // Bytes from the last, incomplete run of the alphabet are thrown away: each letter is as likely as any other.
  constexpr std::size_t usable = 256 / alphabet.size() * alphabet.size();
  String password;
  Bytes random(passwordLength);
  while (password.size() < passwordLength) {
    fillRandom(random);
    for (const std::uint8_t byte : random) {
      if (byte < usable && password.size() < passwordLength) password += alphabet[byte % alphabet.size()];
    }
  }
  OPENSSL_cleanse(random.data(), random.size());
  return password;
}

}  // namespace QVSa::platform
