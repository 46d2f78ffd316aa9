#include "QVSa/settings/MachineSettings.h"

#include "platform/Services.h"

namespace QVSa {

platform::DirectoryQuery::Security directorySecurity() {
  using Security = platform::DirectoryQuery::Security;
  const auto key = platform::services().openSettings(machineSettingsKey);
  const String text = key ? key->value("directorySecurity").value_or("") : "";
  if (text == "startTls") return Security::startTls;
  if (text == "tls") return Security::tls;
  return Security::byPort;
}

}  // namespace QVSa
