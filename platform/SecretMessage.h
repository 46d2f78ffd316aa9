#pragma once

#include <optional>

#include "QVSa/values/Values.h"

namespace QVSa::platform {

// Writes and reads the message form in which secrets are stored: DER in Base64, lines of 64 characters each ended by CR
// LF, the key derived from the password. All of these throw std::bad_alloc for want of memory, and Failure 51 where
// OpenSSL can't run.

// The text in a new message, by DES, with a fresh iv and salt.
String encryptText(const String& plain, const String& secret);

// The text of a message of any algorithm that the form knows. Nothing for an empty message, a broken one, an algorithm
// that this machine's OpenSSL lacks, or a wrong secret, as far as that shows. There is no check value: a wrong secret
// passes a block cipher's padding about once in 256 times. RC4 has no padding, so there it gives some other text
// wherever no surrogate breaks, which is most short ones; at 40 bits, where two keys are tried, the first one then
// hides the second.
std::optional<String> decrypt(const String& cipher, const String& secret);
// The same with the empty text for nothing.
String decryptText(const String& cipher, const String& secret);

// MD5 of the text in the system's ANSI code page (see CodePage.h), as 32 hexadecimal digits in upper case. What the
// code page lacks counts as "?"; throws Failure 6 for a character that takes two bytes there.
String md5Hex(const String& text);

// Overwrites the text's memory, then empties it.
void clearSecret(String& secret);

}  // namespace QVSa::platform
