#pragma once

#include "QVSa/values/Values.h"

namespace QVSa::platform {

// Whether `password` is that of the Windows user `user` of `domain`: an NTLM exchange that the process runs with
// itself, client and server side, four steps. What stands behind the server side is the host's: winbind where the
// machine is a member of a domain, else the mechanism's own file of users. False for anything else: a wrong or empty
// password, an unknown user or domain, a locked account, no mechanism.
Boolean ntlmLogon(const String& user, const String& domain, const String& password);

}  // namespace QVSa::platform
