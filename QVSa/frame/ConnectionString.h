#pragma once

#include "QVSa/values/Values.h"

namespace QVSa {

struct ConnectionOptions;

// The connection string for `server` ("host", "host,port" or "file:folder", each optionally with "|" and a scrambled
// password behind it) and `DBName` (empty: QVSys): the login QVUser with the password of `server` or the built-in one,
// or the process's own identity where `integrated`. A password must hold no semicolon. Throws as defaultDbPwd does.
QVSA_EXPORT String buildConnString(const String& server, const String& DBName, Boolean integrated);

// The password of QVUser that the deployment secrets give. Throws as deploymentSecrets does.
String defaultDbPwd();

// `server` without its password part.
QVSA_EXPORT String serverOnly(const String& server);

// A reversible scrambling without a key, meant for ASCII; the result holds "@" and "A" to "O" only, two for each
// character and two more. scrambleText throws Failure 5 where a character's code cannot be carried (a stage of the rule
// then exceeds one byte, which happens for about a fifth of random texts). unscrambleText of anything else than a
// scrambled text gives garbage, never a failure. Both give the empty text for the empty text.
QVSA_EXPORT String scrambleText(const String& text);
QVSA_EXPORT String unscrambleText(const String& text);

// Whether a data source is the folder of an embedded installation: "file:" and its path.
bool isFolder(const String& dataSource);

// Takes a connection string apart. Keywords have any case and order; unknown ones are passed over, and the last of two
// holds. Throws 0x80004005 where there is no data source, for a part without "=", and beside a folder for any keyword
// that is unknown or comes twice: a path must hold no semicolon.
ConnectionOptions parseConnectionString(const String& connectionString);

}  // namespace QVSa
