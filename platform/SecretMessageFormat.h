#pragma once

#include <optional>

#include "QVSa/values/Values.h"

namespace QVSa::platform {

// Algorithms by the numbers that stand in a message.
namespace algorithm {
constexpr Long des = 0x6601;
constexpr Long rc2 = 0x6602;
constexpr Long tripleDes = 0x6603;
constexpr Long rc4 = 0x6801;
constexpr Long aes128 = 0x660E;
constexpr Long aes192 = 0x660F;
constexpr Long aes256 = 0x6610;
}  // namespace algorithm

// What a message holds.
struct SealedText {
  Long algorithm = 0;
  Long keyLength = 0;  // bits
  Bytes iv;
  Bytes salt;
  Bytes cipherText;
};

// Both throw std::bad_alloc for want of memory.

// The message in Base64, its lines ended by CR LF.
String writeSealedText(const SealedText& sealed);
// White space anywhere in the message is passed over. Nothing for a message of any other form.
std::optional<SealedText> readSealedText(const String& message);

}  // namespace QVSa::platform
