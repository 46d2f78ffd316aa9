#pragma once

#include "QVSa/frame/Values.h"
#include "platform/DirectoryLookup.h"

namespace QVSa {

// The key under which a machine keeps its texts, in the host's settings store.
constexpr const char* machineSettingsKey = "Software\\Morvane\\Tabulon";

// How this machine speaks to the directory server, by the text "directorySecurity" under the key: "startTls", "tls", or
// anything else, and nothing, for the rule of the port.
platform::DirectoryQuery::Security directorySecurity();

}  // namespace QVSa
