#include "providers/tsql/PrintState.h"
#include "providers/tsql/Printer.h"

namespace QVSa::tsql {

void Writer::write(const AlterDatabase& alter) {
  add("alter database " + printName(alter.database) + " set ");
  add(alter.singleUser ? "single_user" : "multi_user");
  if (alter.noWait) add(" with no_wait");
}

void Writer::write(const BackupDatabase& backup) {
  add("backup database " + printName(backup.database) + " to disk = ");
  writeToken(backup.file);
  add(" with init");
}

void Writer::write(const RestoreDatabase& restore) {
  add("restore database " + printName(restore.database) + " from disk = ");
  writeToken(restore.file);
  add(" with ");
  for (const auto& move : restore.moves) {
    add("move ");
    writeToken(move.name);
    add(" to ");
    writeToken(move.file);
    add(", ");
  }
  add("replace");
}

void Writer::write(const VerifyBackup& verify) {
  add("restore verifyonly from disk = ");
  writeToken(verify.file);
}

}  // namespace QVSa::tsql
