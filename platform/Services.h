#pragma once

#include <functional>

#include "QVSa/values/Date.h"
#include "QVSa/values/Values.h"
#include "platform/DirectoryLookup.h"
#include "platform/SettingsStore.h"

namespace QVSa::platform {

// What the library asks of its host system and a test may want to answer itself.
struct Services {
  std::function<Date()> localTime;              // the machine's local date and time
  std::function<String()> computerName;         // at most 128 characters, trimmed
  std::function<void(const String&)> eventLog;  // one line for the system's event log
  std::function<String()> programFolder;        // of the running program, without a separator at its end
  std::function<std::unique_ptr<SettingsKey>(const String& path)> openSettings;  // nothing where it can't be opened

  // The packages that check the accounts whose password the library does not keep. One left empty is a package that
  // this process does not have: every account that needs it is refused, as for a wrong password.
  std::function<Boolean(const String& user, const String& domain, const String& password)> ntlmLogon;
  std::function<String(const DirectoryQuery& query, const String& password, Integer& status)> getUsersFromLD;
};

const Services& services();

// Replaces the services; the old ones come back. For start-up and tests: not while another thread uses them.
Services replaceServices(Services services);

}  // namespace QVSa::platform
