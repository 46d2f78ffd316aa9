#pragma once

#include "QVSa/frame/Connection.h"

namespace QVSa {

// An open connection to master as a log-in of the database server, without a time limit. Throws 5 for a ";" in the
// log-in or its password, else as Connection.Open does.
Connection openAs(const String& server, const String& login, const String& password);

}  // namespace QVSa
