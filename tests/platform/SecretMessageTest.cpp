#include <algorithm>
#include <cstdint>
#include <gtest/gtest.h>
#include <memory>
#include <openssl/err.h>
#include <openssl/evp.h>
#include <openssl/provider.h>

#include "QVSa/values/Failure.h"
#include "platform/SecretMessage.h"
#include "platform/SecretMessageCipher.h"
#include "tests/support/EnvironmentLocale.h"

namespace QVSa::platform {
namespace {

const String secret = "Secret1!";
const String greeting = "Hello, CAPICOM!";

Bytes fromHex(const String& hex) {
  Bytes bytes;
  for (std::size_t at = 0; at < hex.size(); at += 2) {
    bytes.push_back(static_cast<std::uint8_t>(std::stoi(hex.substr(at, 2), nullptr, 16)));
  }
  return bytes;
}

const Bytes salt = fromHex("000102030405060708090a0b0c0d0e0f");
const Bytes shortIv = fromHex("0001020304050607");

Bytes utf16(const String& ascii) {
  Bytes bytes;
  for (const char c : ascii) bytes.insert(bytes.end(), {static_cast<std::uint8_t>(c), 0});
  return bytes;
}

// Enciphers by a library context of the test's own.
class Writer {
 public:
  Writer() : context_(OSSL_LIB_CTX_new(), OSSL_LIB_CTX_free) {
    default_ = OSSL_PROVIDER_load(context_.get(), "default");
    legacy_ = OSSL_PROVIDER_load(context_.get(), "legacy");
  }
  Writer(const Writer&) = delete;
  Writer& operator=(const Writer&) = delete;
  ~Writer() {
    OSSL_PROVIDER_unload(default_);
    if (legacy_ != nullptr) OSSL_PROVIDER_unload(legacy_);
  }

  bool hasOldCiphers() const { return legacy_ != nullptr; }

  Bytes encipher(const char* name, const Bytes& key, const Bytes& iv, const Bytes& plain, int effectiveBits = 0) const {
    EVP_CIPHER* cipher = EVP_CIPHER_fetch(context_.get(), name, nullptr);
    EVP_CIPHER_CTX* run = EVP_CIPHER_CTX_new();
    EVP_EncryptInit_ex2(run, cipher, nullptr, nullptr, nullptr);
    EVP_CIPHER_CTX_set_key_length(run, static_cast<int>(key.size()));
    if (effectiveBits != 0) EVP_CIPHER_CTX_ctrl(run, EVP_CTRL_SET_RC2_KEY_BITS, effectiveBits, nullptr);
    EVP_EncryptInit_ex2(run, nullptr, key.data(), iv.empty() ? nullptr : iv.data(), nullptr);
    Bytes result(plain.size() + 32);
    int length = 0;
    int rest = 0;
    EVP_EncryptUpdate(run, result.data(), &length, plain.data(), static_cast<int>(plain.size()));
    EVP_EncryptFinal_ex(run, result.data() + length, &rest);
    result.resize(static_cast<std::size_t>(length) + static_cast<std::size_t>(rest));
    EVP_CIPHER_CTX_free(run);
    EVP_CIPHER_free(cipher);
    return result;
  }

 private:
  std::unique_ptr<OSSL_LIB_CTX, decltype(&OSSL_LIB_CTX_free)> context_;
  OSSL_PROVIDER* default_;
  OSSL_PROVIDER* legacy_;
};

// A DES message of any content under the secret.
String desMessage(const Bytes& content) {
  const Bytes key = fromHex("560d17d58710d9b4560d17d58710d9b4560d17d58710d9b4");
  return writeSealedText({algorithm::des, 64, shortIv, salt, Writer().encipher("DES-EDE3-CBC", key, shortIv, content)});
}

TEST(SecretMessage, IsWrittenInTheStoredFormToTheByte) {
  const std::optional<SealedText> sealed = sealText(greeting, secret, shortIv, salt);
  ASSERT_TRUE(sealed);
  EXPECT_EQ(sealed->cipherText, fromHex("32388472f5a8614e1918d71ae972698cbdd132b3aff5acac93a2d8361f253d59"));
  EXPECT_EQ(writeSealedText(*sealed),
            "MGkGCSsGAQQBgjdYA6BcMFoGCisGAQQBgjdYAwGgTDBKAgMCAAECAmYBAgFABAgA\r\n"
            "AQIDBAUGBwQQAAECAwQFBgcICQoLDA0ODwQgMjiEcvWoYU4ZGNca6XJpjL3RMrOv\r\n"
            "9aysk6LYNh8lPVk=\r\n");
  EXPECT_EQ(decryptText(writeSealedText(*sealed), secret), greeting);
}

TEST(SecretMessage, GivesBackEveryTextUnderItsSecretAlone) {
  for (const String& text : {String(), String("x"), String("p\u00e4ss \u5bc6\u7801 \U0001F511"), String(100000, 'a')}) {
    const String message = encryptText(text, "\u738b\u5c0f\u660e");
    EXPECT_EQ(decryptText(message, "\u738b\u5c0f\u660e"), text);
    EXPECT_EQ(message.substr(message.size() - 2), "\r\n");
  }
  EXPECT_EQ(decryptText(encryptText("a", ""), ""), "a");
  EXPECT_NE(encryptText("a", secret), encryptText("a", secret));

  const String message = encryptText(greeting, secret);
  int readable = 0;
  for (int i = 0; i < 500; ++i) {
    const String other = decryptText(message, "wrong" + std::to_string(i));
    EXPECT_NE(other, greeting);
    if (!other.empty()) ++readable;
  }
  EXPECT_LT(readable, 25);
}

TEST(SecretMessage, OfEveryAlgorithmIsRead) {
  const String hash = "560d17d58710d9b4acf3e05bf2d74e201041c3a2";
  const String extended = "0e1e0b7c073149b907b8780ec8583d346426e50b1c752335";
  const Bytes longIv = fromHex("000102030405060708090a0b0c0d0e0f");
  // Long enough that the other key of 40 bits does not read by chance.
  const String text(4000, 'k');
  const auto message = [&](Long id, Long bits, const char* cipher, const String& keyHex, const Bytes& iv) {
    const int effectiveBits = id == algorithm::rc2 ? bits : 0;
    const Bytes content = Writer().encipher(cipher, fromHex(keyHex), iv, utf16(text), effectiveBits);
    return decryptText(writeSealedText({id, bits, iv, salt, content}), secret);
  };

  EXPECT_EQ(decryptText(writeSealedText({algorithm::tripleDes, 192, shortIv, salt,
                                         fromHex("c7f4bc81a3c90f0f04e392e3c2fe230b94282fde905fdf93eeaff7045b9501ec")}),
                        secret),
            greeting);
  EXPECT_EQ(message(algorithm::aes128, 128, "AES-128-CBC", extended.substr(0, 32), longIv), text);
  EXPECT_EQ(message(algorithm::aes192, 192, "AES-192-CBC", extended, longIv), text);
  EXPECT_EQ(message(algorithm::aes256, 256, "AES-256-CBC", extended + "29d172627787b68b", longIv), text);
  if (!Writer().hasOldCiphers()) GTEST_SKIP() << "This machine's OpenSSL has no RC2 and RC4.";
  EXPECT_EQ(message(algorithm::rc2, 128, "RC2-CBC", hash.substr(0, 32), shortIv), text);
  EXPECT_EQ(message(algorithm::rc2, 56, "RC2-CBC", hash.substr(0, 14), shortIv), text);
  EXPECT_EQ(message(algorithm::rc2, 40, "RC2-CBC", hash.substr(0, 10), shortIv), text);
  EXPECT_EQ(message(algorithm::rc2, 40, "RC2-CBC", hash.substr(0, 10) + String(22, '0'), shortIv), text);
  EXPECT_EQ(message(algorithm::rc4, 128, "RC4", hash.substr(0, 32), {}), text);
  EXPECT_EQ(message(algorithm::rc4, 56, "RC4", hash.substr(0, 14), {}), text);
  EXPECT_EQ(message(algorithm::rc4, 40, "RC4", hash.substr(0, 10), {}), text);
  EXPECT_EQ(message(algorithm::rc4, 40, "RC4", hash.substr(0, 10) + String(22, '0'), {}), text);
  EXPECT_EQ(message(algorithm::rc4, 64, "RC4", hash.substr(0, 16), {}), "");
  EXPECT_EQ(message(0x6604, 64, "RC4", hash.substr(0, 16), {}), "");
}

TEST(SecretMessage, WithContentThatIsNoTextIsEmpty) {
  EXPECT_EQ(decryptText(desMessage(fromHex("61003dd811dd")), secret), "a\U0001F511");
  for (const char* content : {"610062", "61003dd8", "11dd6100", "11dd11dd", "3dd83dd8", "3dd86100"}) {
    EXPECT_EQ(decryptText(desMessage(fromHex(content)), secret), "") << content;
  }
}

TEST(SecretMessage, IsReadWithWhiteSpaceAnywhere) {
  const String message = encryptText(greeting, secret);
  String spread = " \t";
  for (const char c : message) spread += String(1, c) + (c == 'A' ? "\t \r\n" : "\n");
  EXPECT_EQ(decryptText(spread, secret), greeting);
  String oneLine = message;
  std::erase_if(oneLine, [](char c) { return c == '\r' || c == '\n'; });
  EXPECT_EQ(decryptText(oneLine, secret), greeting);
}

TEST(SecretMessage, ThatIsBrokenGivesAnEmptyTextAndLeavesNoErrorBehind) {
  ERR_clear_error();
  const String message = writeSealedText(sealText(greeting, secret, shortIv, salt));
  const std::size_t end = message.find('=');
  for (std::size_t length = 0; length < end; ++length) EXPECT_EQ(decryptText(message.substr(0, length), secret), "");
  for (const char* text : {"\r\n", "plain", "MA==", "MIAAAA==", "MIT/////", "MGkGCSsG=AQQB"}) {
    EXPECT_EQ(decryptText(text, secret), "") << text;
  }
  for (std::size_t at = 0; at < end; ++at) {
    for (const char wrong : {'%', '=', '\0', '\x7F', '\xC3'}) {
      String changed = message;
      changed[at] = wrong;
      EXPECT_EQ(decryptText(changed, secret), "") << at << " " << static_cast<int>(wrong);
    }
  }
  EXPECT_EQ(ERR_peek_error(), 0U);
}

TEST(SecretMessage, WithAnyByteOfItsStructureChangedIsRefusedOrRead) {
  const String message = writeSealedText(sealText(greeting, secret, shortIv, salt));
  Bytes der(message.size());
  EVP_ENCODE_CTX* decoder = EVP_ENCODE_CTX_new();
  int length = 0;
  int rest = 0;
  EVP_DecodeInit(decoder);
  EVP_DecodeUpdate(decoder, der.data(), &length, reinterpret_cast<const unsigned char*>(message.data()),
                   static_cast<int>(message.size()));
  EVP_DecodeFinal(decoder, der.data() + length, &rest);
  EVP_ENCODE_CTX_free(decoder);
  der.resize(static_cast<std::size_t>(length) + static_cast<std::size_t>(rest));
  const auto encode = [](const Bytes& bytes) {
    String base64(bytes.size() * 2 + 4, '\0');
    base64.resize(static_cast<std::size_t>(EVP_EncodeBlock(reinterpret_cast<unsigned char*>(base64.data()),
                                                           bytes.data(), static_cast<int>(bytes.size()))));
    return base64;
  };

  ASSERT_EQ(decryptText(encode(der), secret), greeting);
  const auto content = std::search(der.begin(), der.end(), shortIv.begin(), shortIv.end());
  const Bytes arc = fromHex("2b0601040182375803");  // both types begin with it
  int types = 0;
  for (auto at = der.begin(); (at = std::search(at, content, arc.begin(), arc.end())) != content; ++at, ++types) {
    Bytes other = der;
    ++other[static_cast<std::size_t>(at - der.begin()) + 7];
    EXPECT_EQ(decryptText(encode(other), secret), "") << "a type that is not looked at";
  }
  EXPECT_EQ(types, 2);
  for (auto at = der.begin(); at != der.end(); ++at) {
    EXPECT_EQ(decryptText(encode(Bytes(der.begin(), at)), secret), "");
    const std::uint8_t kept = *at;
    for (int value = 0; value < 256; ++value) {
      *at = static_cast<std::uint8_t>(value);
      const String text = decryptText(encode(der), secret);
      EXPECT_TRUE(at < content || value == kept || text != greeting) << at - der.begin() << " " << value;
    }
    *at = kept;
  }
}

TEST(Md5Hex, IsTheDigestOfTheCodePagesBytes) {
  const test::EnvironmentLocale western("en_US.UTF-8");
  EXPECT_EQ(md5Hex(""), "D41D8CD98F00B204E9800998ECF8427E");
  EXPECT_EQ(md5Hex("abc"), "900150983CD24FB0D6963F7D28E17F72");
  EXPECT_EQ(md5Hex("\u00e9\u20ac"), "C17CA5490B95AA07BB32D9127125086F");
  EXPECT_EQ(md5Hex("a\u5bc6\xFF\U0001F511"), md5Hex("a????")) << "what the code page lacks";
}

TEST(ClearSecret, OverwritesTheMemory) {
  String text = "a secret that is longer than a small text";
  const auto place = reinterpret_cast<std::uintptr_t>(text.data());
  const std::size_t size = text.size();
  clearSecret(text);
  EXPECT_TRUE(text.empty());
  // The text keeps its memory, so it may be looked at.
  text.resize(1);
  ASSERT_EQ(reinterpret_cast<std::uintptr_t>(text.data()), place);
  EXPECT_TRUE(std::all_of(text.data() + 1, text.data() + size, [](char c) { return c == '\0'; }));
}

}  // namespace
}  // namespace QVSa::platform
