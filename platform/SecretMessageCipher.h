#pragma once

#include "QVSa/values/Values.h"
#include "platform/SecretBytes.h"
#include "platform/SecretMessageFormat.h"

namespace QVSa::platform {

// All of these throw std::bad_alloc for want of memory, and Failure 51 where OpenSSL can't run.

// The text enciphered by DES under a key made of the secret and the salt. The iv has 8 bytes.
SealedText sealText(const String& plain, const String& secret, const Bytes& iv, const Bytes& salt);

// The text of a message of any known algorithm; nothing where it does not decrypt.
std::optional<String> openSealedText(const SealedText& sealed, const String& secret);

// A digest by OpenSSL's name for it, as "SHA1".
SecretBytes digest(const char* name, const SecretBytes& data);

Bytes randomBytes(std::size_t count);

}  // namespace QVSa::platform
