#include "providers/odbc/Driver.h"

#include <algorithm>
#include <cctype>
#include <filesystem>

#include "platform/ServerSettings.h"
#include "providers/odbc/Environment.h"

namespace QVSa::odbc {

namespace {

constexpr const char* microsoftDrivers[] = {"ODBC Driver 18 for SQL Server", "ODBC Driver 17 for SQL Server"};
constexpr const char* freeTdsDriver = "FreeTDS";

Driver named(const String& name) {
  String file = name.substr(name.rfind('/') + 1);
  std::transform(file.begin(), file.end(), file.begin(),
                 [](unsigned char c) { return static_cast<char>(std::tolower(c)); });
  return {name, file.find("tds") != String::npos};
}

std::vector<String> registeredDrivers() {
  std::vector<String> result;
  SQLCHAR name[256];
  SQLCHAR attributes[1024];
  SQLSMALLINT length = 0;
  SQLUSMALLINT direction = SQL_FETCH_FIRST;
  while (SQL_SUCCEEDED(
      SQLDrivers(environment(), direction, name, sizeof name, &length, attributes, sizeof attributes, nullptr))) {
    result.emplace_back(reinterpret_cast<const char*>(name));
    direction = SQL_FETCH_NEXT;
  }
  return result;
}

// Distributions install the driver's library by architecture, some without registering it.
String freeTdsLibrary() {
  std::error_code error;
  for (const auto& entry : std::filesystem::directory_iterator("/usr/lib", error)) {
    const auto library = entry.path() / "odbc" / "libtdsodbc.so";
    if (std::filesystem::exists(library, error)) return library.string();
  }
  return {};
}

// FreeTDS reads on to the first "};" and takes every brace before it as it stands; the others want "}" doubled.
String braced(const String& value, bool freeTds) {
  if (freeTds && value.find("};") != String::npos) {
    throw Failure(number::general, "ODBC",
                  "A user, a password or a database's name holds what the driver cannot take.");
  }
  String result = "{";
  for (const char c : value) {
    result += c;
    if (c == '}' && !freeTds) result += c;
  }
  return result + "};";
}

Failure refused(const String& reason) { return Failure(number::general, "ODBC", reason); }

bool isPort(const String& text) {
  const bool digits = !text.empty() && text.size() <= 5 && text.find_first_not_of("0123456789") == String::npos;
  return digits && std::stoi(text) >= 1 && std::stoi(text) <= 65535;
}

// A server without braces: the drivers look for a port or an instance in it. What would end it can't be a host.
String serverText(const String& dataSource, const Access& access) {
  if (dataSource.find_first_of(";{}") != String::npos) throw refused("The name of the server is not valid.");
  const auto comma = dataSource.rfind(',');
  const String host = dataSource.substr(0, comma);
  const String port = comma == String::npos ? "" : dataSource.substr(comma + 1);
  if (comma != String::npos && !isPort(port)) throw refused("The port of the server is not valid.");
  const bool ofFile = access.driver.freeTds && access.certificate == "driver";
  if (ofFile && !port.empty())
    throw refused(
        "The certificate is checked by an entry of freetds.conf, which names the port: name that entry alone.");
  if (ofFile) return "Servername=" + host + ";";
  if (!access.driver.freeTds || port.empty()) return "Server=" + dataSource + ";";
  return "Server=" + host + ";Port=" + port + ";";
}

String freeTdsSecurity(const Access& access) {
  if (access.certificate == "checked")
    throw refused(
        "FreeTDS checks a certificate only by an entry of freetds.conf: set certificate to driver, and name that entry "
        "as the server.");
  const String level = access.encryption == "required"   ? "require"
                       : access.encryption == "optional" ? "request"
                                                         : "off";
  return "TDS_Version=7.4;ClientCharset=UTF-8;Encryption=" + level + ";";
}

// SQL Server makes a certificate of its own where it was given none, so encryption always works; checking who signed it
// would refuse most installations, and version 18 would do that by default.
String otherSecurity(const Access& access) {
  const String encrypt = access.encryption == "required" ? "Encrypt=yes;" : "Encrypt=no;";
  if (access.certificate == "driver") return encrypt;
  return encrypt + "TrustServerCertificate=" + (access.certificate == "checked" ? "no;" : "yes;");
}

}  // namespace

Driver chooseDriver(const String& wanted, const std::vector<String>& registered, const String& library) {
  const auto isRegistered = [&](const char* name) {
    return std::find(registered.begin(), registered.end(), name) != registered.end();
  };
  if (!wanted.empty()) return named(wanted);
  for (const char* name : microsoftDrivers) {
    if (isRegistered(name)) return named(name);
  }
  if (isRegistered(freeTdsDriver)) return named(freeTdsDriver);
  if (!library.empty()) return named(library);
  throw Failure(number::general, "ODBC", "No ODBC driver for SQL Server is installed.");
}

Driver systemDriver(const String& wanted) {
  // Asked once: the driver manager's list is read by steps that two threads must not take at the same time.
  // Never destroyed: a host may call with its last statics.
  static const auto& registered = *new std::vector<String>(registeredDrivers());
  static const auto& library = *new String(freeTdsLibrary());
  return chooseDriver(wanted, registered, library);
}

Access systemAccess() {
  auto settings = platform::serverSettingsInForce();
  const auto value = [&](const char* name) { return settings[name].value; };
  return {systemDriver(value("odbc-driver")), value("encryption"), value("certificate"), value("driver-options"),
          std::chrono::seconds(std::stoi(value("keep-seconds")))};
}

String connectionText(const ConnectionOptions& options, const Access& access) {
  const auto value = [&](const String& plain) { return braced(plain, access.driver.freeTds); };
  String text = "Driver=" + value(access.driver.name) + serverText(options.dataSource, access);
  if (options.integrated) {
    text += "Trusted_Connection=yes;";
  } else {
    text += "UID=" + value(options.user) + "PWD=" + value(options.password);
  }
  text += access.driver.freeTds ? freeTdsSecurity(access) : otherSecurity(access);
  const bool open = !access.driverOptions.empty() && access.driverOptions.back() != ';';
  return text + access.driverOptions + (open ? ";" : "");
}

String databaseText(const String& database, const Driver& driver) {
  return database.empty() ? "" : "Database=" + braced(database, driver.freeTds);
}

}  // namespace QVSa::odbc
