#pragma once

#include <functional>

#include "QVSa/frame/Date.h"
#include "QVSa/frame/Values.h"

namespace QVSa::platform {

// What the library asks of its host system and a test may want to answer itself.
struct Services {
  std::function<Date()> localTime;              // the machine's local date and time
  std::function<String()> computerName;         // at most 128 characters, trimmed
  std::function<void(const String&)> eventLog;  // one line for the system's event log
};

const Services& services();

// Replaces the services; the old ones come back. For start-up and tests: not while another thread uses them.
Services replaceServices(Services services);

}  // namespace QVSa::platform
