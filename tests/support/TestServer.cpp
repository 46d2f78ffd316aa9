#include "tests/support/TestServer.h"

#include <cstdlib>
#include <iostream>
#include <regex>
#include <stdexcept>

#include "QVSa/hosting/ServerInstallation.h"
#include "QVSa/values/Text.h"
#include "database/Scripts.h"
#include "providers/tsql/Parser.h"
#include "tests/support/FakeClock.h"

namespace QVSa::test {

namespace {

struct Database {
  const char* name;
  const std::string_view& script;
};

const Database databases[] = {{"QVSys", database::qvSys}, {"QVApp", database::qvApp}, {"QVUpdate", database::qvUpdate}};

String variable(const char* name) {
  const char* value = std::getenv(name);
  return value == nullptr ? "" : value;
}

// Puts the clock of the test into what goes to the server.
class ClockedSession : public ProviderSession {
 public:
  explicit ClockedSession(std::unique_ptr<ProviderSession> session) : session_(std::move(session)) {}

  BatchResult run(const Batch& batch) override {
    // A column's default is another time each time that it is used.
    static const std::regex now("getdate\\(\\)", std::regex::icase);
    Batch clocked = batch;
    if (FakeClock::stands() && batch.text.find("create table") == String::npos)
      clocked.text =
          std::regex_replace(batch.text, now, "convert(datetime,'" + platform::services().localTime().sqlText() + "')");
    return session_->run(clocked);
  }
  void begin() override { session_->begin(); }
  void commit() override { session_->commit(); }
  void rollback() override { session_->rollback(); }

 private:
  std::unique_ptr<ProviderSession> session_;
};

bool fillsTables(const String& batch) {
  for (const tsql::Statement& statement : tsql::parse(tsql::tokenize(batch)))
    if (!std::holds_alternative<tsql::Insert>(statement) && !std::holds_alternative<tsql::SetOption>(statement))
      return false;
  return true;
}

void run(Connection& connection, const std::string_view& script, bool rowsAlone) {
  for (const String& batch : tsql::splitScript(String(script)))
    if (!rowsAlone || fillsTables(batch)) connection.Execute(batch);
}

}  // namespace

bool onServer() { return !variable("QVSA_TEST_SERVER").empty(); }

TestServer& TestServer::instance() {
  static TestServer server;
  return server;
}

TestServer::TestServer() : server_(variable("QVSA_TEST_SERVER")), password_(variable("QVSA_TEST_PASSWORD")) {
  refuseOthers();
  before_ = interposeOpener([this](const ConnectionOptions& options) -> std::unique_ptr<ProviderSession> {
    return std::make_unique<ClockedSession>(before_(options));
  });
  try {
    make();
  } catch (...) {
    remove();
    throw;
  }
}

TestServer::~TestServer() { remove(); }

String TestServer::administratorString(const String& database) const {
  return "provider=sqloledb;data source=" + server_ + ";database=" + database + ";uid=sa;pwd=" + password_ + ";";
}

void TestServer::refuseOthers() {
  Connection master = open("master");
  for (const Database& database : databases)
    if (!master.Execute("select 1 where db_id('" + String(database.name) + "') is not null").EOF_())
      throw std::runtime_error("There is a database " + String(database.name) +
                               " on the server: the tests make and remove it. If tests have left it, drop it.");
  hasMadeLogin_ = master.Execute("select 1 where suser_id('QVUser') is not null").EOF_();
}

void TestServer::make() {
  ServerInstallation installation;
  if (!installation.make(server_, "sa", password_, "Adm1n-first"))
    throw std::runtime_error("No installation on the server: " + installation.errDescription());
  for (const Database& database : databases) {
    Connection connection = open(database.name);
    shipped_.push_back(objects(connection));
  }
}

void TestServer::remove() noexcept {
  try {
    Connection master = open("master");
    for (const Database& database : databases) {
      const String name = database.name;
      if (master.Execute("select 1 where db_id('" + name + "') is not null").EOF_()) continue;
      master.Execute("alter database " + name + " set single_user with no_wait");
      master.Execute("drop database " + name);
    }
    if (hasMadeLogin_) master.Execute("if suser_id('QVUser') is not null drop login QVUser");
  } catch (const std::exception& failure) {
    std::cerr << "The server is not as it was: " << failure.what() << "\n";
  }
  interposeOpener(std::move(before_));
}

void TestServer::ship() {
  auto shipped = shipped_.begin();
  for (const Database& database : databases) {
    Connection connection = open(database.name);
    const Objects found = objects(connection);
    const bool isWhole = found == *shipped++;
    if (isWhole) {
      String truncation;
      for (const auto& [name, kind] : found)
        if (kind == "table") truncation += "truncate table [" + name + "] ";
      connection.Execute(truncation);
    } else {
      drop(connection, found);
    }
    run(connection, database.script, isWhole);
  }
}

void TestServer::empty() {
  for (const Database& database : databases) {
    Connection connection = open(database.name);
    drop(connection, objects(connection));
  }
}

Connection TestServer::open(const String& database) const {
  Connection connection;
  connection.CommandTimeout(0);
  connection.Open(administratorString(database));
  return connection;
}

TestServer::Objects TestServer::objects(Connection& connection) {
  Objects result;
  Recordset row = connection.Execute(
      "select name,case type when 'U' then 'table' when 'V' then 'view' else 'synonym' end kind from sys.objects "
      "where type in ('U','V','SN') and is_ms_shipped=0");
  for (; !row.EOF_(); row.MoveNext()) result[row["name"].asText()] = row["kind"].asText();
  return result;
}

void TestServer::drop(Connection& connection, const Objects& objects) {
  for (const auto& [name, kind] : objects) connection.Execute("drop " + kind + " [" + name + "]");
}

}  // namespace QVSa::test
