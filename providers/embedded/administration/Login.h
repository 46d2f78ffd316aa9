#pragma once

#include <string>

#include "providers/embedded/storage/Handle.h"

namespace QVSa::embedded {

// Checks a log-in of the installation. Throws 18456 for an unknown user and a wrong password alike.
// A password is checked against its slow digest once a process; after that its keyed fingerprint is compared, as long
// as the stored digest stays the same. The digest itself is read again when the installation's definitions changed.
void checkLogin(Handle& handle, const std::string& user, const std::string& password);

}  // namespace QVSa::embedded
