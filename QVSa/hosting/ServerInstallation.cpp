#include "QVSa/hosting/ServerInstallation.h"

#include "QVSa/frame/ConnectionString.h"
#include "QVSa/hosting/internal/FirstAdministrator.h"
#include "QVSa/hosting/internal/LoginConnection.h"
#include "database/Scripts.h"
#include "providers/Provider.h"
#include "providers/tsql/Parser.h"

namespace QVSa {

namespace {

using Batches = std::vector<String>;

struct Database {
  const char* name;
  const std::string_view& script;
};

constexpr const char* userLogin = "QVUser";
const Database databases[] = {{"QVSys", database::qvSys}, {"QVApp", database::qvApp}, {"QVUpdate", database::qvUpdate}};

// A database's name is one of ours.
String quoted(const String& text) { return "N'" + replaceAll(text, "'", "''") + "'"; }

// Runs a script within one transaction, unless `isDone` holds. The first error ends the transaction, and what stands
// behind it is then read and not run.
void addScript(Batches& batches, const String& database, const String& isDone, const std::string_view& script) {
  batches.push_back("use " + database);
  batches.push_back("if " + isDone + " set noexec on");
  batches.emplace_back("set xact_abort on begin transaction");
  for (const String& batch : tsql::splitScript(String(script))) {
    batches.push_back(batch);
    batches.emplace_back("if @@trancount=0 set noexec on");
  }
  batches.emplace_back("commit transaction");
  batches.emplace_back("set noexec off");
}

String userPassword(const String& server) { return parseConnectionString(buildConnString(server, "", false)).password; }

// The token <userPassword> stands for QVUser's.
Batches steps() {
  Batches batches;
  batches.push_back("if suser_id(" + quoted(userLogin) + ") is null create login " + userLogin +
                    " with password=<userPassword>, check_policy=off");
  for (const Database& database : databases) {
    const String name = database.name;
    batches.push_back("if db_id(" + quoted(name) + ") is null create database " + name);
    batches.push_back("use " + name);
    batches.push_back("if N'a'<>N'A' raiserror(N'The database " + name +
                      " needs a collation that does not heed case.',16,1)");
    batches.push_back("if isnull((select suser_sname(owner_sid) from sys.databases where name=" + quoted(name) +
                      "),N'')<>" + quoted(userLogin) + " alter authorization on database::" + name + " to " +
                      userLogin);
  }
  for (const Database& database : databases)
    addScript(batches, database.name, "exists(select * from sys.tables)", database.script);
  return batches;
}

String asScript(const String& head, const Batches& batches) {
  String result = head;
  for (const String& batch : batches) result += batch + "\nGO\n";
  return result;
}

}  // namespace

Boolean ServerInstallation::make(const String& server, const String& login, const String& password,
                                 const String& adminPassword) {
  return operation(plain(), [&] {
    {
      Connection connection = openAs(server, login, password);
      const String ofUser = userPassword(server);
      for (const String& batch : steps()) connection.Execute(sql(batch).secret("userPassword", ofUser));
    }
    if (isAdministratorWaiting(server)) setAdministratorsPassword(server, adminPassword);
    return true;
  });
}

Boolean ServerInstallation::isComplete(const String& server) {
  return operation(plain(), [&] { return !isAdministratorWaiting(server); });
}

Boolean ServerInstallation::ignoresCase(const String& server, const String& database) {
  return operation(plain(), [&] {
    Connection connection;
    connection.Open(buildConnString(server, database, false));
    return !connection.Execute("select 1 where N'a'=N'A'").EOF_();
  });
}

String ServerInstallation::script(const String& server) {
  const String text = asScript(
      "-- The databases, their log-in, tables and first rows. Can be run again: what is there is left alone. It holds "
      "the\n"
      "-- log-in's password: keep it from others. Run `qvsa init` afterwards, which sets the administrator's "
      "password.\n",
      steps());
  return replaceAll(text, "<userPassword>", quoted(userPassword(server)));
}

String ServerInstallation::upgradeScript() {
  Batches batches;
  addScript(batches, "QVSys", "exists(select * from sys.indexes where name=N'departments_isOrg')", database::qvSys2);
  return asScript("-- From layout 1 of the databases to layout 2. Can be run again: what is there is left alone.\n",
                  batches);
}

}  // namespace QVSa
