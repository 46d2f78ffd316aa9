#include "platform/LocaleName.h"

#include <cstdlib>

#include "QVSa/values/Text.h"

namespace QVSa::platform {

namespace {

String firstSet(const char* category) {
  for (const char* name : {"LC_ALL", category, "LANG"}) {
    const char* value = std::getenv(name);
    if (value != nullptr && *value != '\0') return value;
  }
  return {};
}

// Cuts off what stands behind the separator and returns it.
String cutAt(String& text, char separator) {
  const std::size_t place = text.find(separator);
  if (place == String::npos) return {};
  String behind = text.substr(place + 1);
  text.resize(place);
  return behind;
}

}  // namespace

bool LocaleName::isTraditionalChinese() const {
  if (language != "zh") return false;
  return script.empty() ? territory == "TW" || territory == "HK" || territory == "MO" : script == "Hant";
}

LocaleName localeName(const char* category) {
  String rest = firstSet(category);
  cutAt(rest, '@');
  LocaleName locale;
  locale.encoding = cutAt(rest, '.');
  const std::vector<String> parts = split(rest, '_');
  locale.language = parts.front();
  constexpr std::size_t scriptLength = 4;
  for (std::size_t i = 1; i < parts.size(); ++i)
    (parts[i].size() == scriptLength ? locale.script : locale.territory) = parts[i];
  return locale;
}

}  // namespace QVSa::platform
