#include "QVSa/frame/ConnectionString.h"
#include "QVSa/frame/Version.h"
#include "QVSa/maintenance/DBMgr.h"
#include "platform/Folders.h"

namespace QVSa {

namespace {

// A database in single-user mode, given back to its users on every way out while the connection lives.
class SingleUserMode {
 public:
  SingleUserMode(Connection& connection, const String& database) : connection_(connection), database_(database) {
    connection_.Execute("alter database " + database_ + " set SINGLE_USER");
  }
  ~SingleUserMode() {
    if (ended_) return;
    try {
      end();
    } catch (...) {
      // What ended the restore is what the caller hears of.
    }
  }
  SingleUserMode(const SingleUserMode&) = delete;
  SingleUserMode& operator=(const SingleUserMode&) = delete;

  void end() {
    connection_.Execute("alter database " + database_ + " set MULTI_USER");
    ended_ = true;
  }

 private:
  Connection& connection_;
  String database_;
  bool ended_ = false;
};

}  // namespace

Boolean DBMgr::RestoreDB(const String& ServerName, const String& sysFile, const String& appFile, const String& saPwd,
                         Boolean, const String& saUid) {
  return operation(prefixed(message::notRestored), [&] {
    if (!platform::fileExists(appFile)) fail("DBMgr", message::applicationBackupMissing, {appFile});
    if (!platform::fileExists(sysFile)) fail("DBMgr", message::systemBackupMissing, {sysFile});
    saConnString_ = "provider=sqloledb;data source=" + serverOnly(ServerName) + ";database=master;uid=" + saUid +
                    ";pwd=" + saPwd + ";";
    if (!restoreOneDB("QVSys", sysFile)) return false;
    upgradeSysDB(ServerName);
    if (!restoreOneDB("QVApp", appFile)) return false;
    clearTransient(ServerName);
    return true;
  });
}

Boolean DBMgr::restoreOneDB(const String& DBName, const String& bakFile) {
  return operation(plain(), [&]() -> Boolean {
    try {
      Connection connection;
      connection.CommandTimeout(0);
      connection.Open(saConnString_);
      SingleUserMode alone(connection, DBName);
      connection.Execute("use " + DBName);
      Recordset files;
      files.Open("select name, fileName from sysfiles", connection);
      const auto rows = files.GetRows();
      files.Close();
      if (rows.size() < 2) return refuse(message::backupDamaged);
      connection.Execute("use master");
      connection.Execute(restoreStatement(DBName, bakFile, rows));
      alone.end();
      connection.Execute("use " + DBName);
      connection.Execute("sp_changedbowner N'QVUser'");
      return true;
    } catch (const Failure& failure) {
      throw Failure(failure.number(), failure.source(), failure.description() + ":" + text(failure.native()),
                    failure.native());
    }
  });
}

// The files of the database as it stands here, not those that the backup was made from, decide where the copy goes.
String DBMgr::restoreStatement(const String& DBName, const String& bakFile,
                               const std::vector<std::vector<Variant>>& files) {
  String statement = "RESTORE DATABASE " + DBName + " FROM DISK = N'" + bakFile + "'" + " With ";
  const char* between = "";
  for (const auto& file : files) {
    statement += between;
    statement += " move N'" + trim(file[0].toText()) + "' to N'" + trim(file[1].toText()) + "'";
    between = ",";
  }
  return statement + ",replace";
}

// Before this release roles were rows of Users.
void DBMgr::upgradeSysDB(const String& ServerName) {
  Connection connection;
  connection.Open(buildConnString(ServerName, "", false));
  Recordset row;
  row.Open("select isnull(release,'6.5') from sysinfo", connection);
  const String release = row.EOF_() ? "6.5" : row[0].asText();
  row.Close();
  constexpr Integer lower = 1;
  if (compareVersion(release, "6.6.5") != lower) return;
  connection.Execute(
      "CREATE TABLE Roles ("
      "roleId int IDENTITY,"
      "roleName nvarchar(50) NOT NULL DEFAULT '',"
      "roleDesc nvarchar(500) NULL DEFAULT '',"
      "roleSpec ntext NULL,"
      "builtIn smallint NULL DEFAULT 0,"
      "Primary key(roleId)"
      ")");
  connection.Execute("SET IDENTITY_INSERT roles on");
  connection.Execute(
      "insert into roles(roleId,roleName,roleDesc,roleSpec,builtIn)"
      " select userId,userName,userDesc,userPwd,isAbstract"
      " From Users"
      " Where isRole = 1");
  connection.Execute(" set identity_insert roles off");
}

// Sessions, checked-out templates and checked-out work items belong to the moment of the backup.
void DBMgr::clearTransient(const String& ServerName) {
  Connection connection;
  connection.CommandTimeout(0);
  connection.Open(buildConnString(ServerName, "", false));
  connection.Execute("delete from sesLog");
  connection.Execute("update reptmps set ifCheckout=0,checkOutBy=null Where ifCheckOut = 1");
  connection.Execute("update CFWorkItems set state=0,checkOutBy=0,checkOutByName='' where state=1");
}

}  // namespace QVSa
