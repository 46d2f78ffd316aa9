#pragma once

#include "QVSa/frame/Values.h"

namespace QVSa::platform {

// Writes and reads the message form in which secrets are stored: DER in Base64, lines of 64 characters each ended by CR
// LF, the key derived from the password.

// The text in a new message, by DES, with a fresh iv and salt. The empty text on any failure.
String encryptText(const String& plain, const String& secret);

// The text of a message of any algorithm that the form knows. The empty text for an empty message, a broken one, a
// wrong secret (there is no check value: a wrong secret gives some other text about once in 256 times), or an algorithm
// that this machine's OpenSSL lacks.
String decryptText(const String& cipher, const String& secret);

// MD5 of the text in the system's ANSI code page (see CodePage.h), as 32 hexadecimal digits in upper case. Throws
// Failure 6 for a character that does not fit one byte.
String md5Hex(const String& text);

// Overwrites the text's memory, then empties it.
void clearSecret(String& secret);

}  // namespace QVSa::platform
