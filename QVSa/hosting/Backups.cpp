#include "QVSa/hosting/Backups.h"

#include "QVSa/frame/ConnectionString.h"
#include "QVSa/hosting/SafeTexts.h"
#include "QVSa/maintenance/DBMgr.h"

namespace QVSa {

namespace {

void require(bool holds, const String& otherwise) {
  if (!holds) throw Failure(number::argument, "Backups", otherwise);
}

}  // namespace

Boolean Backups::backUp(const String& folder, const String& lockPassword) {
  return operation(plain(), [&]() -> Boolean {
    nameFiles(folder);
    DBMgr manager;
    if (!manager.BackUpDB(server(), sysFile_, appFile_, "", lockPassword)) return refuseAs(manager);
    return true;
  });
}

Boolean Backups::restore(const String& folder, const String& password, const String& login) {
  return operation(plain(), [&]() -> Boolean {
    nameFiles(folder);
    require((login + password).find(';') == String::npos, "A log-in and its password must hold no semicolon.");
    DBMgr manager;
    if (!manager.RestoreDB(server(), sysFile_, appFile_, password, false, login)) return refuseAs(manager);
    return true;
  });
}

// The lock is written to the running system, where it stays and goes into every copy; without reports none is written.
Boolean Backups::isLocked(Boolean& locked) {
  return operation(plain(), [&] {
    Connection connection;
    connection.Open(buildConnString(server(), "", false));
    locked = !connection.Execute("select roleId from roles where roleId=4 and roleSpec like '_%'").EOF_();
    return true;
  });
}

void Backups::nameFiles(const String& folder) {
  require(isPlainPath(folder), "The path of a backup must hold no quote.");
  // A server's paths are parted as its system does it, which the caller knows.
  const bool hasSlashes = isFolder(serverOnly(server())) || folder.find('/') != String::npos;
  const String separator = hasSlashes ? "/" : "\\";
  sysFile_ = folder + separator + "sys.bak";
  appFile_ = folder + separator + "app.bak";
}

}  // namespace QVSa
