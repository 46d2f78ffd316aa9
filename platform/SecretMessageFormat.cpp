#include "platform/SecretMessageFormat.h"

#include <limits>
#include <memory>
#include <new>
#include <openssl/asn1t.h>
#include <openssl/evp.h>
#include <openssl/objects.h>

#include "platform/OpenSsl.h"

namespace QVSa::platform {

namespace {

constexpr char envelopeType[] = "1.3.6.1.4.1.311.88.3";
constexpr char contentType[] = "1.3.6.1.4.1.311.88.3.1";
constexpr long messageVersion = 0x00020001;
constexpr std::size_t lineLength = 64;

// The message is three nested sequences; the outer two begin with their object identifier.
struct Sealed {
  ASN1_INTEGER* version;
  std::int32_t algorithm;
  std::int32_t keyLength;
  ASN1_OCTET_STRING* iv;
  ASN1_OCTET_STRING* salt;
  ASN1_OCTET_STRING* cipherText;
};

struct Typed {
  ASN1_OBJECT* type;
  Sealed* sealed;
};

struct Envelope {
  ASN1_OBJECT* type;
  Typed* content;
};

// clang-format off
ASN1_SEQUENCE(Sealed) = {
  ASN1_SIMPLE(Sealed, version, ASN1_INTEGER),
  ASN1_EMBED(Sealed, algorithm, INT32),
  ASN1_EMBED(Sealed, keyLength, INT32),
  ASN1_SIMPLE(Sealed, iv, ASN1_OCTET_STRING),
  ASN1_SIMPLE(Sealed, salt, ASN1_OCTET_STRING),
  ASN1_SIMPLE(Sealed, cipherText, ASN1_OCTET_STRING),
} static_ASN1_SEQUENCE_END(Sealed)

ASN1_SEQUENCE(Typed) = {
  ASN1_SIMPLE(Typed, type, ASN1_OBJECT),
  ASN1_EXP(Typed, sealed, Sealed, 0),
} static_ASN1_SEQUENCE_END(Typed)

ASN1_SEQUENCE(Envelope) = {
  ASN1_SIMPLE(Envelope, type, ASN1_OBJECT),
  ASN1_EXP(Envelope, content, Typed, 0),
} static_ASN1_SEQUENCE_END(Envelope)

struct FreeEnvelope {
  void operator()(Envelope* envelope) const {
    ASN1_item_free(reinterpret_cast<ASN1_VALUE*>(envelope), ASN1_ITEM_rptr(Envelope));
  }
};
// clang-format on
using EnvelopePointer = std::unique_ptr<Envelope, FreeEnvelope>;

struct FreeDecoder {
  void operator()(EVP_ENCODE_CTX* decoder) const { EVP_ENCODE_CTX_free(decoder); }
};

bool isType(const ASN1_OBJECT* type, const String& expected) {
  char name[80];
  const int length = OBJ_obj2txt(name, sizeof name, type, 1);
  return length == static_cast<int>(expected.size()) && expected == name;
}

bool setBytes(ASN1_OCTET_STRING* target, const Bytes& bytes) {
  return ASN1_OCTET_STRING_set(target, bytes.data(), static_cast<int>(bytes.size())) == 1;
}

Bytes bytesOf(const ASN1_OCTET_STRING* text) {
  const unsigned char* data = ASN1_STRING_get0_data(text);
  return Bytes(data, data + ASN1_STRING_length(text));
}

EnvelopePointer makeEnvelope(const SealedText& sealed) {
  EnvelopePointer envelope(reinterpret_cast<Envelope*>(ASN1_item_new(ASN1_ITEM_rptr(Envelope))));
  if (!envelope) throw std::bad_alloc();
  Typed& content = *envelope->content;
  Sealed& target = *content.sealed;
  envelope->type = OBJ_txt2obj(envelopeType, 1);
  content.type = OBJ_txt2obj(contentType, 1);
  target.algorithm = sealed.algorithm;
  target.keyLength = sealed.keyLength;
  const bool filled = envelope->type != nullptr && content.type != nullptr &&
                      ASN1_INTEGER_set(target.version, messageVersion) == 1 && setBytes(target.iv, sealed.iv) &&
                      setBytes(target.salt, sealed.salt) && setBytes(target.cipherText, sealed.cipherText);
  if (!filled) throw std::bad_alloc();
  return envelope;
}

Bytes toDer(const Envelope& envelope) {
  const auto* value = reinterpret_cast<const ASN1_VALUE*>(&envelope);
  const int size = ASN1_item_i2d(value, nullptr, ASN1_ITEM_rptr(Envelope));
  if (size <= 0) throw std::bad_alloc();
  Bytes der(static_cast<std::size_t>(size));
  unsigned char* end = der.data();
  if (ASN1_item_i2d(value, &end, ASN1_ITEM_rptr(Envelope)) != size) throw std::bad_alloc();
  return der;
}

String toBase64Lines(const Bytes& der) {
  String base64((der.size() + 2) / 3 * 4 + 1, '\0');
  const int length =
      EVP_EncodeBlock(reinterpret_cast<unsigned char*>(base64.data()), der.data(), static_cast<int>(der.size()));
  base64.resize(static_cast<std::size_t>(length));
  String lines;
  for (std::size_t at = 0; at < base64.size(); at += lineLength) lines += base64.substr(at, lineLength) + "\r\n";
  return lines;
}

Bytes fromBase64(const String& message) {
  const std::unique_ptr<EVP_ENCODE_CTX, FreeDecoder> decoder(EVP_ENCODE_CTX_new());
  if (!decoder) throw std::bad_alloc();
  if (message.size() > std::numeric_limits<int>::max()) return {};
  EVP_DecodeInit(decoder.get());
  Bytes der(message.size() + 3);
  int length = 0;
  int restLength = 0;
  const auto* text = reinterpret_cast<const unsigned char*>(message.data());
  if (EVP_DecodeUpdate(decoder.get(), der.data(), &length, text, static_cast<int>(message.size())) < 0) return {};
  if (EVP_DecodeFinal(decoder.get(), der.data() + length, &restLength) != 1) return {};
  der.resize(static_cast<std::size_t>(length) + static_cast<std::size_t>(restLength));
  return der;
}

}  // namespace

String writeSealedText(const SealedText& sealed) { return toBase64Lines(toDer(*makeEnvelope(sealed))); }

std::optional<SealedText> readSealedText(const String& message) {
  const Bytes der = fromBase64(message);
  const unsigned char* start = der.data();
  const EnvelopePointer envelope(reinterpret_cast<Envelope*>(
      ASN1_item_d2i(nullptr, &start, static_cast<long>(der.size()), ASN1_ITEM_rptr(Envelope))));
  if (!envelope) {
    // The decoder refuses a text of another form and a lack of memory in the same way.
    if (memoryWasShort()) throw std::bad_alloc();
    return std::nullopt;
  }
  if (!isType(envelope->type, envelopeType) || !isType(envelope->content->type, contentType)) return std::nullopt;
  const Sealed& sealed = *envelope->content->sealed;
  return SealedText{sealed.algorithm, sealed.keyLength, bytesOf(sealed.iv), bytesOf(sealed.salt),
                    bytesOf(sealed.cipherText)};
}

}  // namespace QVSa::platform
