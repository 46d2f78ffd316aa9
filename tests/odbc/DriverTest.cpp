#include <cstdlib>
#include <fstream>
#include <gtest/gtest.h>
#include <sstream>

#include "platform/ServerSettings.h"
#include "providers/odbc/Driver.h"
#include "tests/support/TestInstallation.h"

namespace QVSa::odbc {
namespace {

ConnectionOptions options(const String& dataSource) {
  ConnectionOptions result;
  result.dataSource = dataSource;
  result.user = "QVUser";
  result.password = "p;w}d";
  return result;
}

TEST(Driver, IsTheWantedOneElseMicrosoftsNewestElseFreeTds) {
  const std::vector<String> all{"FreeTDS", "ODBC Driver 17 for SQL Server", "ODBC Driver 18 for SQL Server"};
  const String library = "/lib/odbc/libtdsodbc.so";
  EXPECT_EQ(chooseDriver("", all, library).name, "ODBC Driver 18 for SQL Server");
  EXPECT_EQ(chooseDriver("", {all[0], all[1]}, library).name, "ODBC Driver 17 for SQL Server");
  EXPECT_EQ(chooseDriver("", {"SQLite3", "FreeTDS"}, library).name, "FreeTDS");
  EXPECT_EQ(chooseDriver("", {"SQLite3"}, library).name, library);
  EXPECT_EQ(chooseDriver("Mine", all, library).name, "Mine");
  EXPECT_THROW(chooseDriver("", {"SQLite3"}, ""), Failure);
}

TEST(Driver, IsKnownAsFreeTdsByItsNameOrItsLibrary) {
  EXPECT_TRUE(chooseDriver("FreeTDS", {}, "").freeTds);
  EXPECT_TRUE(chooseDriver("/opt/x/libtdsodbc.so.0", {}, "").freeTds);
  EXPECT_FALSE(chooseDriver("/opt/tds/libmsodbcsql-18.so", {}, "").freeTds);
}

Access access(const String& driver, const String& encryption = "required", const String& certificate = "unchecked") {
  return {chooseDriver(driver, {}, ""), encryption, certificate, "", {}};
}

TEST(ConnectionText, IsWrittenAsEachDriverReadsIt) {
  EXPECT_EQ(connectionText(options("db1,1433"), access("ODBC Driver 18 for SQL Server")),
            "Driver={ODBC Driver 18 for SQL Server};Server=db1,1433;UID={QVUser};PWD={p;w}}d};"
            "Encrypt=yes;TrustServerCertificate=yes;");
  EXPECT_EQ(connectionText(options("db1,1433"), access("FreeTDS")),
            "Driver={FreeTDS};Server=db1;Port=1433;UID={QVUser};PWD={p;w}d};"
            "TDS_Version=7.4;ClientCharset=UTF-8;Encryption=require;");
  EXPECT_NE(connectionText(options("db1\\x"), access("FreeTDS")).find("Server=db1\\x;UID="), String::npos);
  EXPECT_EQ(databaseText("a}b", {"Other", false}), "Database={a}}b};");
  EXPECT_EQ(databaseText("", {"Other", false}), "");
}

TEST(ConnectionText, AsksForTheSecurityThatIsSet) {
  struct Asked {
    const char *driver, *encryption, *certificate, *text;
  };
  for (const Asked& asked : {Asked{"FreeTDS", "optional", "unchecked", "Encryption=request;"},
                             {"FreeTDS", "off", "unchecked", "Encryption=off;"},
                             {"FreeTDS", "required", "driver", "{FreeTDS};Servername=db1;UID"},
                             {"Other", "off", "unchecked", "Encrypt=no;"},
                             {"Other", "required", "checked", "Encrypt=yes;TrustServerCertificate=no;"}}) {
    EXPECT_NE(
        connectionText(options("db1"), access(asked.driver, asked.encryption, asked.certificate)).find(asked.text),
        String::npos)
        << asked.text;
  }
  EXPECT_EQ(connectionText(options("db1"), access("Other", "required", "driver")).find("Trust"), String::npos);
  EXPECT_THROW(connectionText(options("db1"), access("FreeTDS", "required", "checked")), Failure);
  EXPECT_THROW(connectionText(options("db1,1433"), access("FreeTDS", "required", "driver")), Failure);
  Access more = access("FreeTDS");
  more.driverOptions = "UseNTLMv2=yes";
  EXPECT_NE(connectionText(options("db1"), more).find("Encryption=require;UseNTLMv2=yes;"), String::npos);
}

TEST(ConnectionText, HasNeitherUserNorPasswordWithIntegratedSecurity) {
  auto integrated = options("db1");
  integrated.integrated = true;
  const String text = connectionText(integrated, access("FreeTDS"));
  EXPECT_NE(text.find("Trusted_Connection=yes;"), String::npos);
  EXPECT_EQ(text.find("UID"), String::npos);
  EXPECT_EQ(text.find("PWD"), String::npos);
}

TEST(ConnectionText, RefusesWhatWouldSmuggleInASettingAndWhatIsNoPort) {
  for (const char* server : {"db1;Encrypt=no", "db1,1434-gone", "db1,", "db1,0", "db1,65536", "db1, 1433"}) {
    EXPECT_THROW(connectionText(options(server), access("Other")), Failure) << server;
    EXPECT_THROW(connectionText(options(server), access("FreeTDS")), Failure) << server;
  }
  auto hidden = options("db1");
  hidden.password = "x};Server={db2";
  EXPECT_THROW(connectionText(hidden, access("FreeTDS")), Failure);
  EXPECT_NE(connectionText(hidden, access("Other")).find("PWD={x}};Server={db2};"), String::npos);
}

TEST(Access, StandsInTheDocumentAsItIs) {
  std::stringstream document;
  document << std::ifstream(QVSA_SOURCE_DIR "/docs/sql-server.md").rdbuf();
  for (const auto& setting : platform::serverSettings) {
    const String standard = *setting.standard == '\0' ? "" : String("`") + setting.standard + "` ";
    const String row = String("| `") + setting.name + "` | `" + setting.variable + "` | " + standard + "|";
    EXPECT_NE(document.str().find(row), String::npos) << row;
  }
}

TEST(Access, IsWhatTheNearestPlaceSays) {
  const test::TestFolder folder;
  const String file = (folder.path() / "qvsa.conf").string();
  const auto write = [&](const String& text) { std::ofstream(file) << text; };
  setenv("QVSA_CONF", file.c_str(), 1);
  setenv("QVSA_KEEP_SECONDS", "7", 1);
  setenv("QVSA_ENCRYPTION", "", 1);
  write("# how servers are reached\n\n encryption=optional\r\nodbc-driver = \tMine \nkeep-seconds = 5");
  EXPECT_EQ(systemAccess().driver.name, "Mine");
  EXPECT_EQ(systemAccess().encryption, "optional");
  EXPECT_EQ(systemAccess().certificate, "unchecked");
  EXPECT_EQ(systemAccess().keep, std::chrono::seconds(7));
  platform::setServerSetting("keep-seconds", "60");
  EXPECT_EQ(systemAccess().keep, std::chrono::seconds(60));
  EXPECT_EQ(platform::serverSettingsInForce()["encryption"].source, file);
  for (const char* wrong : {"encrytion = off", "encryption = none", "encryption", "keep-seconds = 1m"}) {
    write(wrong);
    EXPECT_THROW(systemAccess(), Failure) << wrong;
  }
  std::filesystem::remove(file);
  EXPECT_THROW(systemAccess(), Failure) << "it was named";
  for (const char* variable : {"QVSA_CONF", "QVSA_KEEP_SECONDS", "QVSA_ENCRYPTION"}) unsetenv(variable);
}

}  // namespace
}  // namespace QVSa::odbc
