#include "providers/tsql/ParserState.h"

namespace QVSa::tsql {

Token Parser::text() {
  if (now().kind != TokenKind::string) refuse();
  return take();
}

// disk = 'file'
Token Parser::disk() {
  expectWord("disk");
  expectSymbol("=");
  return text();
}

Statement Parser::alter() {
  take();
  if (takeWord("login")) return alterLogin();
  expectWord("database");
  AlterDatabase alter;
  alter.database = expectName();
  expectWord("set");
  alter.singleUser = takeWord("single_user");
  if (!alter.singleUser) expectWord("multi_user");
  if (!takeWord("with")) return alter;
  expectWord("no_wait");
  alter.noWait = true;
  return alter;
}

// A backup that adds to what the file holds is not known here, nor is one that keeps no word on it.
Statement Parser::backup() {
  take();
  expectWord("database");
  BackupDatabase backup;
  backup.database = expectName();
  expectWord("to");
  backup.file = disk();
  expectWord("with");
  expectWord("init");
  return backup;
}

Statement Parser::restore() {
  take();
  if (takeWord("verifyonly")) return verify();
  expectWord("database");
  RestoreDatabase restore;
  restore.database = expectName();
  expectWord("from");
  restore.file = disk();
  expectWord("with");
  while (takeWord("move")) {
    RestoreDatabase::Move move;
    move.name = text();
    expectWord("to");
    move.file = text();
    restore.moves.push_back(std::move(move));
    expectSymbol(",");
  }
  expectWord("replace");
  return restore;
}

Statement Parser::verify() {
  expectWord("from");
  return VerifyBackup{disk()};
}

}  // namespace QVSa::tsql
