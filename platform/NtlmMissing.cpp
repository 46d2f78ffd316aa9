// In place of Ntlm.cpp in a build without NTLM.
#include "QVSa/values/Failure.h"
#include "platform/Ntlm.h"

namespace QVSa::platform {

Boolean ntlmLogon(const String&, const String&, const String&) {
  throw Failure(number::general, "Ntlm", "This build knows no accounts of a Windows domain (NTLM).");
}

}  // namespace QVSa::platform
