#pragma once

#include <functional>

#include "QVSa/frame/Values.h"

namespace QVSa {

// The packages that check the accounts whose password the library does not keep. A member left empty is a package that
// this process does not have; every account that needs it is then refused, as for a wrong password.
struct DomainAuthentication {
  // True only for a valid Windows user, domain and password.
  std::function<Boolean(const String& user, const String& domain, const String& password)> ntlmLogon;
  // True where the directory holds `dn`: bound as the service account with `authLd`, `password` then being of no
  // account, otherwise as the user himself.
  std::function<Boolean(const String& dn, const String& password, Boolean authLd)> ldapBind;
};

// This build is linked with neither an NTLM mechanism nor a directory client: both members are empty.
const DomainAuthentication& domainAuthentication();

// Puts other packages in place; the old ones come back. For start-up and tests: not while another thread signs on.
DomainAuthentication replaceDomainAuthentication(DomainAuthentication packages);

}  // namespace QVSa
