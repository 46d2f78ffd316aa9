#include "platform/LocaleName.h"

#include <cstdlib>

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
  return language == "zh" && (territory == "TW" || territory == "HK" || territory == "MO");
}

LocaleName localeName(const char* category) {
  String rest = firstSet(category);
  cutAt(rest, '@');
  LocaleName locale;
  locale.encoding = cutAt(rest, '.');
  locale.territory = cutAt(rest, '_');
  locale.language = rest;
  return locale;
}

}  // namespace QVSa::platform
