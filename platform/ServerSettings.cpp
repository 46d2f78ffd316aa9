#include "platform/ServerSettings.h"

#include <algorithm>
#include <cstdlib>

#include "QVSa/values/Failure.h"
#include "QVSa/values/Text.h"
#include "platform/Files.h"
#include "platform/NamedLines.h"

namespace QVSa::platform {

namespace {

using Settings = std::map<String, SettingInForce>;

// Never destroyed: a host may call with its last statics.
Settings& told() {
  static auto& settings = *new Settings();
  return settings;
}

Failure refused(const String& reason) { return Failure(number::general, "Settings", reason); }

bool isChoice(const ServerSetting& setting, const String& value) {
  if (String(setting.name) == "keep-seconds")
    return !value.empty() && value.size() < 6 && value.find_first_not_of("0123456789") == String::npos;
  const auto choices = split(setting.choices, ' ');
  return *setting.choices == '\0' || std::ranges::find(choices, value) != choices.end();
}

void put(Settings& settings, const String& name, const String& value, const String& source) {
  const auto* const setting =
      std::ranges::find_if(serverSettings, [&](const ServerSetting& known) { return name == known.name; });
  if (setting == serverSettings.end()) throw refused("\"" + name + "\" is no setting (" + source + ").");
  if (!isChoice(*setting, value)) {
    const String choices = *setting->choices == '\0' ? "a number of seconds" : replaceAll(setting->choices, " ", ", ");
    throw refused("\"" + value + "\" is no value of the setting " + name + " (" + source + "): " + choices + ".");
  }
  settings[name] = {value, source};
}

void putFile(Settings& settings, const String& path) {
  const Bytes content = readFile(path);
  for (const NamedLine& line : namedLines(String(content.begin(), content.end()))) {
    if (line.name.empty()) throw refused("Line " + text(line.number) + " is no \"name = value\" (" + path + ").");
    put(settings, line.name, line.value, path);
  }
}

void putFiles(Settings& settings) {
  if (const char* named = std::getenv("QVSA_CONF")) return putFile(settings, named);
  try {
    putFile(settings, "/etc/qvsa/qvsa.conf");
  } catch (const Failure& failure) {
    if (failure.number() != number::noFile && failure.number() != number::noPath) throw;
  }
}

}  // namespace

Settings serverSettingsInForce() {
  Settings settings;
  for (const ServerSetting& setting : serverSettings) settings[setting.name] = {setting.standard, "default"};
  putFiles(settings);
  for (const ServerSetting& setting : serverSettings)
    if (const char* value = std::getenv(setting.variable); value != nullptr && *value != '\0')
      put(settings, setting.name, value, setting.variable);
  for (const auto& [name, setting] : told()) settings[name] = setting;
  return settings;
}

void setServerSetting(const String& name, const String& value) { put(told(), name, value, "option"); }

}  // namespace QVSa::platform
