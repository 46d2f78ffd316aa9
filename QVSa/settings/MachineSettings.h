#pragma once

#include <optional>

#include "QVSa/values/Values.h"
#include "platform/DirectoryLookup.h"

namespace QVSa {

// The key under which a machine keeps its texts, in the host's settings store.
constexpr const char* machineSettingsKey = "Software\\Morvane\\Tabulon";

// How this machine speaks to the directory server, by the text "directorySecurity" under the key, without regard to
// case and white space around: "startTls", "tls", or no text for the rule of the port. Nothing where the text is
// another one or can't be read: the server then must not be asked, since passwords could go to it in clear.
std::optional<platform::DirectoryQuery::Security> directorySecurity();

}  // namespace QVSa
