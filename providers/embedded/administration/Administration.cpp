#include "providers/embedded/administration/Administration.h"

#include <algorithm>

#include "providers/embedded/administration/Backup.h"
#include "providers/embedded/administration/Restore.h"
#include "providers/embedded/session/Session.h"
#include "providers/tsql/SqlFailure.h"

namespace QVSa::embedded {

namespace {

using tsql::sqlFailure;

constexpr std::size_t master = 0;

std::size_t knownDatabase(const std::string& name) {
  const auto database = databaseByName(name);
  if (!database)
    throw sqlFailure(911, "Database '" + name + "' does not exist. Make sure that the name is entered correctly.");
  return *database;
}

// The copy goes where the database lies: a statement may say so, it cannot say otherwise.
void checkMoves(const tsql::RestoreDatabase& restore, const std::filesystem::path& folder, std::size_t database) {
  const auto files = filesOf(folder, databaseNames[database]);
  for (const auto& move : restore.moves) {
    const auto file =
        std::ranges::find_if(files, [&](const NamedFile& known) { return sameName(known.name, move.name.text); });
    if (file == files.end())
      throw sqlFailure(3234, "Logical file '" + move.name.text + "' is not part of database '" + restore.database +
                                 "'. Use RESTORE FILELISTONLY to list the logical file names.");
    if (file->path != move.file.text)
      throw sqlFailure(3156, "File '" + move.name.text + "' cannot be restored to '" + move.file.text +
                                 "'. Use WITH MOVE to identify a valid location for the file.");
  }
}

// Has a database alone for a while, unless that was so before.
class AloneMeanwhile {
 public:
  AloneMeanwhile(RowLocks& locks, const std::string& database) : locks_(locks), before_(locks.isAlone()) {
    if (!locks_.tryTakeAlone())
      throw sqlFailure(3101,
                       "Exclusive access could not be obtained because the database '" + database + "' is in use.");
  }
  ~AloneMeanwhile() {
    if (!before_) locks_.endAlone();
  }
  AloneMeanwhile(const AloneMeanwhile&) = delete;
  AloneMeanwhile& operator=(const AloneMeanwhile&) = delete;

 private:
  RowLocks& locks_;
  bool before_;
};

}  // namespace

bool Administration::run(const tsql::Statement& statement) {
  if (const auto* alter = std::get_if<tsql::AlterDatabase>(&statement)) return alterDatabase(*alter), true;
  if (const auto* backup = std::get_if<tsql::BackupDatabase>(&statement)) return backUpDatabase(*backup), true;
  if (const auto* restore = std::get_if<tsql::RestoreDatabase>(&statement)) return restoreDatabase(*restore), true;
  if (const auto* verify = std::get_if<tsql::VerifyBackup>(&statement)) return verifyBackup(*verify), true;
  const auto* call = std::get_if<tsql::Call>(&statement);
  return call && callProcedure(*call);
}

bool Administration::callProcedure(const tsql::Call& call) {
  if (sameName(call.procedure.name, "sp_changedbowner")) return changeOwner(call), true;
  if (sameName(call.procedure.name, "sp_getapplock")) return takeApplicationLock(call), true;
  return false;
}

void Administration::requireAdministrator() const {
  if (!administrator_) throw sqlFailure(229, "User does not have permission to perform this action.");
}

void Administration::requireNoTransaction() const {
  if (transaction_.isOpen()) throw sqlFailure(3021, "Cannot perform this operation within a transaction.");
}

// Waits until every other session has left the database. The mode ends with the session at the latest.
void Administration::alterDatabase(const tsql::AlterDatabase& alter) {
  requireNoTransaction();
  const std::size_t database = knownDatabase(alter.database);
  if (database == master)
    throw sqlFailure(5058, "Option 'SINGLE_USER' cannot be set in database '" + alter.database + "'.");
  RowLocks& locks = handle().locks(database);
  if (!alter.singleUser) {
    if (locks.isAlone()) return locks.endAlone();
    return workspace_.enter(database);
  }
  while (!locks.tryTakeAlone()) {
    if (alter.noWait)
      throw sqlFailure(5061, "ALTER DATABASE failed because a lock could not be placed on database '" + alter.database +
                                 "'. Try again later.");
    handle().waitShortly();
  }
}

void Administration::backUpDatabase(const tsql::BackupDatabase& backup) {
  requireNoTransaction();
  const std::size_t database = knownDatabase(backup.database);
  workspace_.enter(database);
  backUp(handle(), database, backup.file.text);
}

void Administration::restoreDatabase(const tsql::RestoreDatabase& restore) {
  requireNoTransaction();
  const std::size_t database = knownDatabase(restore.database);
  if (!administrator_ || database == master)
    throw sqlFailure(3110, "User does not have permission to RESTORE database '" + restore.database + "'.");
  if (database == workspace_.database())
    throw sqlFailure(3102, "RESTORE cannot process database '" + restore.database +
                               "' because it is in use by this session. It is recommended that the master database be "
                               "used when performing this operation.");
  checkMoves(restore, handle().folder(), database);
  const AloneMeanwhile alone(handle().locks(database), restore.database);
  {
    const CatalogueChange change(handle().mark());
    restoreCopy(handle(), database, restore.file.text);
  }
  if (!handle().isCurrent()) workspace_.reopen();
  workspace_.refreshCatalogue();
  session_.upgrade(database);
}

void Administration::verifyBackup(const tsql::VerifyBackup& verify) {
  BackupFile(verify.file.text, handle().deadline()).check();
}

// One log-in owns the databases, from their making on: all that there is to do is to see that it exists.
void Administration::changeOwner(const tsql::Call& call) {
  requireAdministrator();
  const std::string login = call.arguments.size() == 1 ? call.arguments.front()->token.text : std::string();
  if (handle().loginDigest(login).empty())
    throw sqlFailure(15007, "'" + login + "' is not a valid login or you do not have permission.");
}

// Of the modes and owners the exclusive lock of the transaction alone: it is let go at the transaction's end. A name
// takes a table's place among the row locks, so that two names with one hash wait for each other.
void Administration::takeApplicationLock(const tsql::Call& call) {
  const auto& arguments = call.arguments;
  if (arguments.size() != 2 || !sameName(arguments[1]->token.text, "Exclusive"))
    throw sqlFailure(15600, "An invalid parameter or option was specified for procedure 'sp_getapplock'.");
  if (!transaction_.isOpen())
    throw sqlFailure(15626, "You attempted to acquire a transactional application lock without an active transaction.");
  RowLocks& locks = handle().locks(workspace_.database());
  while (!locks.tryLock("application lock " + arguments[0]->token.text, 0)) handle().waitShortly();
}

}  // namespace QVSa::embedded
