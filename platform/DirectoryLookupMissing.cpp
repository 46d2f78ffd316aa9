// In place of DirectoryLookup.cpp in a build without LDAP.
#include "QVSa/values/Failure.h"
#include "platform/DirectoryLookup.h"

namespace QVSa::platform {

String getUsersFromLD(const DirectoryQuery&, const String&, Integer&) {
  throw Failure(number::general, "DirectoryLookup", "This build knows no accounts of a directory (LDAP).");
}

}  // namespace QVSa::platform
