#include "platform/Services.h"

#include <algorithm>
#include <ctime>
#include <filesystem>
#include <syslog.h>
#include <unistd.h>
#include <utility>

#include "QVSa/values/Text.h"
#include "platform/Ntlm.h"

namespace QVSa::platform {

namespace {

constexpr std::size_t computerNameLength = 128;

Date systemLocalTime() {
  const std::time_t now = std::time(nullptr);
  std::tm parts{};
  localtime_r(&now, &parts);
  // A leap second has the number 60.
  return Date(parts.tm_year + 1900, parts.tm_mon + 1, parts.tm_mday, parts.tm_hour, parts.tm_min,
              std::min(parts.tm_sec, 59));
}

String systemComputerName() {
  char buffer[computerNameLength + 1] = {};
  // A longer name comes cut.
  gethostname(buffer, computerNameLength);
  return trim(buffer);
}

// The name stands in the line: openlog would change it for the whole host process.
void writeEventLog(const String& text) {
  String line = text;
  std::ranges::replace_if(
      line, [](unsigned char c) { return c < ' '; }, ' ');
  syslog(LOG_USER | LOG_ERR, "QVSa: %s", line.c_str());
}

String systemProgramFolder() {
  std::error_code ignored;
  return std::filesystem::read_symlink("/proc/self/exe", ignored).parent_path().string();
}

// Never destroyed: a host may call with its last statics.
Services& current() {
  static Services& services =
      *new Services{systemLocalTime,        systemComputerName,  writeEventLog,           systemProgramFolder,
                    platform::openSettings, platform::ntlmLogon, platform::getUsersFromLD};
  return services;
}

}  // namespace

const Services& services() { return current(); }

Services replaceServices(Services services) { return std::exchange(current(), std::move(services)); }

}  // namespace QVSa::platform
