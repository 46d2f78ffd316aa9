#pragma once

#include <vector>

#include "QVSa/values/Failure.h"
#include "providers/odbc/Wide.h"

namespace QVSa::odbc {

// One record of what the driver manager, a driver or the server has to say about a call.
struct Diagnostic {
  String state;  // SQLSTATE, five characters
  Long native = 0;
  String text;
};

std::vector<Diagnostic> diagnostics(SQLSMALLINT handleType, SQLHANDLE handle);

// The failure of a call that left these records, warnings among them. The server's first error decides, else the first
// one at all; its text loses the names in brackets that each layer puts before it. The native number is the server's
// own, 0 where it has not spoken.
Failure failure(const std::vector<Diagnostic>& diagnostics);

// The same for the attempt to connect: a broken link or a time-out there is a server out of reach, with the native
// number 17. A text that repeats the password or part of the connection string is left out.
Failure connectFailure(const std::vector<Diagnostic>& diagnostics, const String& password);

}  // namespace QVSa::odbc
