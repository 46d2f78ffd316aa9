#pragma once

#include <array>

// The secrets of a machine that has no file of its own (see Secrets.h). A build may name another header in
// QVSA_SECRETS_HEADER, with the same constants and builtInSecrets false.
#ifdef QVSA_SECRETS_HEADER
#include QVSA_SECRETS_HEADER
#else

namespace QVSa::secrets {

inline constexpr bool builtInSecrets = true;

// The five pieces of the connection password, joined in this order. The password must hold no semicolon, and both words
// must be such as scrambleText carries, the second one in lower case.
inline constexpr const char* connPwdHead = "Vq7-";
inline constexpr int connPwdNumber = 40962;
inline constexpr const char* connPwdWordA = "amberlock";
inline constexpr const char* connPwdWordB = "Windrose";
inline constexpr const char* connPwdTail = "_k3Zt";

// The ten characters of the rotated key, as codes, so that the key stands nowhere as one text.
inline constexpr std::array<unsigned char, 10> rotatedKeyCharacters{0x4B, 0x39, 0x74, 0x5F, 0x52,
                                                                    0x32, 0x78, 0x2D, 0x4D, 0x6A};
// Where in them the key of the backup lock begins, 0 to 9.
inline constexpr int backupLockKeyStart = 6;

// The key of the passwords that protect report templates, and the password of a template that nobody gave one.
inline constexpr const char* templatePwdKey = "+2741Wq$53";
inline constexpr const char* defaultTemplatePwd = "HoBart";

}  // namespace QVSa::secrets

#endif
