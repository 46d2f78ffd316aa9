#pragma once

#include "QVSa/values/Values.h"

namespace QVSa::platform {

// A question to a directory server. All texts are UTF-8.
struct DirectoryQuery {
  enum class Security {
    byPort,    // TLS from the first byte on the ports 636 and 3269, plain text on any other
    startTls,  // a plain connection that turns to TLS before it says anything
    tls        // TLS from the first byte on any port
  };

  String host;
  Long port = 389;
  // Who asks; empty for nobody.
  String bindDn;
  // A distinguished name: the entries of persons at it and below. Any other text: the persons who have it as their
  // login, mail address or name, anywhere in the directory.
  String searchText;
  Security security = Security::byPort;
  int seconds = 10;  // for each answer of the server, in the TLS handshake too
};

// How a lookup ended. Home.getUsersFromLDS gives these as its result.
enum DirectoryStatus : Integer {
  directoryDone = 0,
  directoryUnreachable = 1,  // no server there, no answer in time, no TLS, or it is not known which TLS is wanted
  directoryRefused = 2,      // name or password wrong, or not allowed
  directoryDisabled = 3,     // the settings do not use a directory; nothing is asked
  directoryFailed = 4        // the search: no such entry, not allowed, given up by the server
};

// Binds with the name of the query and `password`, and searches. A name without a password proves nothing, and most
// servers refuse it.
//
// The users found, one a line that ends with LF: distinguished name, login, display name and mail address, a tab
// between and nothing for what an entry lacks; control characters inside a value read as blanks. Empty where there are
// none, or where `status` is not directoryDone. Certificates are checked by the system's LDAP settings (ldap.conf).
String getUsersFromLD(const DirectoryQuery& query, const String& password, Integer& status);

}  // namespace QVSa::platform
