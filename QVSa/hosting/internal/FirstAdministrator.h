#pragma once

#include "QVSa/values/Values.h"

namespace QVSa {

// The first row of the user Admin is locked and without a password; his first save opens it. Both throw Failure.
Boolean isAdministratorWaiting(const String& server);
void setAdministratorsPassword(const String& server, const String& password);

}  // namespace QVSa
