#include "QVSa/settings/MachineSettings.h"

#include "QVSa/values/Failure.h"
#include "QVSa/values/Text.h"
#include "platform/Services.h"

namespace QVSa {
namespace {

// An editor ends a file with a line break.
String withoutWhiteSpace(const String& text) {
  constexpr const char* whiteSpace = " \t\r\n";
  const std::size_t first = text.find_first_not_of(whiteSpace);
  return first == String::npos ? "" : text.substr(first, text.find_last_not_of(whiteSpace) + 1 - first);
}

}  // namespace

std::optional<platform::DirectoryQuery::Security> directorySecurity() {
  using Security = platform::DirectoryQuery::Security;
  try {
    const auto key = platform::services().openSettings(machineSettingsKey);
    const String text = withoutWhiteSpace(key ? key->value("directorySecurity").value_or("") : "");
    if (text.empty()) return Security::byPort;
    if (sameText(text, "startTls")) return Security::startTls;
    if (sameText(text, "tls")) return Security::tls;
  } catch (const Failure&) {
    // What can't be read is not known to ask for nothing.
  }
  return std::nullopt;
}

}  // namespace QVSa
