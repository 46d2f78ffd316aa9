#pragma once

#include "QVSa/frame/Values.h"
#include "platform/SecretBytes.h"
#include "platform/SecretMessageFormat.h"

namespace QVSa::platform {

// The text enciphered by DES under a key made of the secret and the salt. The iv has 8 bytes. Nothing on failure.
std::optional<SealedText> sealText(const String& plain, const String& secret, const Bytes& iv, const Bytes& salt);

// The text of a message of any known algorithm; empty where it does not read.
String openSealedText(const SealedText& sealed, const String& secret);

// A digest by OpenSSL's name for it, as "SHA1"; empty on failure.
SecretBytes digest(const char* name, const SecretBytes& data);

// So many bytes that nobody can foretell; empty on failure.
Bytes randomBytes(std::size_t count);

}  // namespace QVSa::platform
