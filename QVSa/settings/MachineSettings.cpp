#include "QVSa/settings/MachineSettings.h"

#include "QVSa/values/Failure.h"
#include "QVSa/values/Text.h"
#include "platform/Services.h"

namespace QVSa {

std::optional<platform::DirectoryQuery::Security> directorySecurity() {
  using Security = platform::DirectoryQuery::Security;
  try {
    const auto key = platform::services().openSettings(machineSettingsKey);
    const String value = key ? key->value("directorySecurity").value_or("") : "";
    // An editor ends a file with a line break.
    const String text(trimmed(value, " \t\r\n"));
    if (text.empty()) return Security::byPort;
    if (sameText(text, "startTls")) return Security::startTls;
    if (sameText(text, "tls")) return Security::tls;
  } catch (const Failure&) {
    // What can't be read is not known to ask for nothing.
  }
  return std::nullopt;
}

}  // namespace QVSa
