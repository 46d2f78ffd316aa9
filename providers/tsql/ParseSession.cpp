#include "providers/tsql/ParserState.h"
#include "providers/tsql/SqlFailure.h"
#include "providers/tsql/Words.h"

namespace QVSa::tsql {

Statement Parser::use() {
  take();
  return Use{expectName()};
}

Statement Parser::setOption() {
  take();
  SetOption set;
  if (takeWord("identity_insert")) {
    set.option = "identity_insert";
    set.table = objectName();
  } else {
    if (!isName()) refuse();
    set.option = lowered(now().text);
    if (set.option != "nocount") throw sqlFailure(195, "'" + now().text + "' is not a recognized SET option.");
    take();
  }
  set.on = switchedOn();
  return set;
}

Statement Parser::beginTransaction() {
  take();
  if (!isWord("tran") && !isWord("transaction")) refuse();
  return transaction(Transaction::Kind::begin);
}

Statement Parser::commitTransaction() {
  take();
  return transaction(Transaction::Kind::commit);
}

Statement Parser::rollbackTransaction() {
  take();
  return transaction(Transaction::Kind::rollback);
}

// Transactions do not nest here, so that a name has nothing to tell apart.
Statement Parser::transaction(Transaction::Kind kind) {
  if (takeWord("tran") || takeWord("transaction"))
    optionalName();
  else
    takeWord("work");
  return Transaction{kind};
}

Statement Parser::execute() {
  take();
  return call();
}

Statement Parser::call() {
  Call call;
  call.procedure = objectName();
  if (now().kind == TokenKind::end || isSymbol(";")) return call;
  do call.arguments.push_back(callArgument());
  while (takeSymbol(","));
  return call;
}

ExpressionPtr Parser::callArgument() {
  const bool isSigned = isSymbol("-") || isSymbol("+");
  const TokenKind kind = ahead(isSigned ? 1 : 0).kind;
  if (isWord("null") || (isLiteral(kind) && kind != TokenKind::list)) return sign();
  refuse();
}

}  // namespace QVSa::tsql
