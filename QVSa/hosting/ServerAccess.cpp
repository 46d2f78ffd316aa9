#include "QVSa/hosting/ServerAccess.h"

#include "platform/ServerSettings.h"
#include "providers/ServerDriver.h"

namespace QVSa {

std::vector<ServerSetting> serverAccessNames() {
  std::vector<ServerSetting> result;
  result.reserve(platform::serverSettings.size());
  for (const platform::ServerSetting& setting : platform::serverSettings)
    result.push_back({setting.name, setting.meaning, "", ""});
  return result;
}

std::vector<ServerSetting> serverAccess() {
  const auto inForce = platform::serverSettingsInForce();
  auto result = serverAccessNames();
  for (ServerSetting& setting : result) {
    setting.value = inForce.at(setting.name).value;
    setting.source = inForce.at(setting.name).source;
    if (setting.name == "odbc-driver") setting.value = odbc::serverDriver();
  }
  return result;
}

void setServerAccess(const String& name, const String& value) { platform::setServerSetting(name, value); }

}  // namespace QVSa
