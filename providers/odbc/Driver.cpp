#include "providers/odbc/Driver.h"

#include <algorithm>
#include <cctype>
#include <cstdlib>
#include <filesystem>

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

String serverText(const String& dataSource, bool freeTds) {
  const auto comma = dataSource.rfind(',');
  if (!freeTds || comma == String::npos) return "Server=" + dataSource + ";";
  return "Server=" + dataSource.substr(0, comma) + ";Port=" + dataSource.substr(comma + 1) + ";";
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

Driver systemDriver() {
  // Asked once: the driver manager's list is read by steps that two threads must not take at the same time.
  // Never destroyed: a host may call with its last statics.
  static const auto& registered = *new std::vector<String>(registeredDrivers());
  static const auto& library = *new String(freeTdsLibrary());
  const char* wanted = std::getenv("QVSA_ODBC_DRIVER");
  return chooseDriver(wanted ? wanted : "", registered, library);
}

String connectionText(const ConnectionOptions& options, const Driver& driver) {
  // A server without braces: the drivers look for a port or an instance in it. What would end it can't be a host.
  if (options.dataSource.find_first_of(";{}") != String::npos) {
    throw Failure(number::general, "ODBC", "The name of the server is not valid.");
  }
  const auto value = [&](const String& plain) { return braced(plain, driver.freeTds); };
  String text = "Driver=" + value(driver.name) + serverText(options.dataSource, driver.freeTds);
  if (!options.database.empty()) text += "Database=" + value(options.database);
  if (options.integrated) {
    text += "Trusted_Connection=yes;";
  } else {
    text += "UID=" + value(options.user) + "PWD=" + value(options.password);
  }
  if (driver.freeTds) return text + "TDS_Version=7.4;ClientCharset=UTF-8;";
  // SQL Server makes a certificate of its own where it was given none, so encryption always works; checking who signed
  // it would refuse most installations, and version 18 would do that by default.
  return text + "Encrypt=yes;TrustServerCertificate=yes;";
}

}  // namespace QVSa::odbc
