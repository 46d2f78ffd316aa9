#include "platform/ServerSettings.h"

#include <algorithm>
#include <cstdlib>

#include "QVSa/values/Failure.h"
#include "QVSa/values/Text.h"
#include "platform/Files.h"

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

void putLine(Settings& settings, const String& line, const String& path) {
  const std::size_t mark = line.find('=');
  if (mark == String::npos) throw refused("\"" + line + "\" is no \"name = value\" (" + path + ").");
  put(settings, trim(line.substr(0, mark)), trim(line.substr(mark + 1)), path);
}

void putFile(Settings& settings, const String& path) {
  const Bytes content = readFile(path);
  for (const String& line : split(String(content.begin(), content.end()), '\n')) {
    const String plain = trim(replaceAll(replaceAll(line, "\r", ""), "\t", " "));
    if (!plain.empty() && plain.front() != '#') putLine(settings, plain, path);
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
