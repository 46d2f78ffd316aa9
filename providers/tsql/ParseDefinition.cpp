#include "providers/tsql/ParserState.h"

namespace QVSa::tsql {

Statement Parser::create() {
  take();
  if (takeWord("table")) return createTable();
  if (takeWord("view")) return createView();
  if (takeWord("synonym")) return createSynonym();
  if (takeWord("login")) return createLogin();
  return createIndex();
}

Statement Parser::createTable() {
  CreateTable table;
  table.table = objectName();
  expectSymbol("(");
  do tableElement(table);
  while (takeSymbol(","));
  expectSymbol(")");
  return table;
}

void Parser::tableElement(CreateTable& table) {
  if (takeWord("constraint")) {
    String name = expectName();
    table.keys.push_back(keyDefinition(std::move(name)));
  } else if (isWord("primary") || isWord("unique")) {
    table.keys.push_back(keyDefinition({}));
  } else {
    table.columns.push_back(columnDefinition());
  }
}

KeyDefinition Parser::keyDefinition(String name) {
  KeyDefinition key;
  key.name = std::move(name);
  key.primary = keyKind();
  key.columns = keyColumns();
  return key;
}

// primary key or unique, and how the index lies; true for the primary key.
bool Parser::keyKind() {
  const bool isPrimary = takeWord("primary");
  expectWord(isPrimary ? "key" : "unique");
  if (!takeWord("clustered")) takeWord("nonclustered");
  return isPrimary;
}

// An order given here says how the index is stored, which nothing depends on.
std::vector<String> Parser::keyColumns() {
  std::vector<String> columns;
  expectSymbol("(");
  do {
    columns.push_back(expectName());
    if (!takeWord("asc")) takeWord("desc");
  } while (takeSymbol(","));
  expectSymbol(")");
  return columns;
}

ColumnDefinition Parser::columnDefinition() {
  ColumnDefinition column;
  column.name = expectName();
  column.type = typeName();
  while (columnOption(column)) continue;
  return column;
}

bool Parser::columnOption(ColumnDefinition& column) {
  if (isWord("null") || isWord("not")) {
    column.nullable = !takeWord("not");
    expectWord("null");
    return true;
  }
  if (takeWord("identity")) {
    column.identity = true;
    if (!takeSymbol("(")) return true;
    column.seed = wholeNumber();
    expectSymbol(",");
    column.increment = wholeNumber();
    expectSymbol(")");
    return true;
  }
  if (takeWord("constraint")) {
    expectName();
    if (!isWord("default") && !isWord("primary") && !isWord("unique")) refuse();
  }
  if (takeWord("default")) {
    column.defaultValue = operandValue();
    return true;
  }
  if (!isWord("primary") && !isWord("unique")) return false;
  (keyKind() ? column.primaryKey : column.unique) = true;
  return true;
}

Statement Parser::createView() {
  CreateView view;
  view.view = objectName();
  if (isSymbol("(")) view.columns = columnNames();
  expectWord("as");
  view.select = selectWithTables();
  return view;
}

Statement Parser::createIndex() {
  CreateIndex index;
  index.unique = takeWord("unique");
  if (!takeWord("clustered")) takeWord("nonclustered");
  expectWord("index");
  index.name = expectName();
  expectWord("on");
  index.table = objectName();
  index.columns = keyColumns();
  return index;
}

Statement Parser::createSynonym() {
  CreateSynonym synonym;
  synonym.synonym = objectName();
  expectWord("for");
  synonym.target = objectName();
  return synonym;
}

Statement Parser::createLogin() {
  CreateLogin login;
  login.name = expectName();
  login.password = loginPassword();
  // The rules for passwords of the host system do not exist here: off is what they are.
  if (!takeSymbol(",")) return login;
  expectWord("check_policy");
  expectSymbol("=");
  switchedOn();
  return login;
}

Statement Parser::alterLogin() {
  AlterLogin login;
  login.name = expectName();
  login.password = loginPassword();
  return login;
}

Token Parser::loginPassword() {
  expectWord("with");
  expectWord("password");
  expectSymbol("=");
  if (now().kind != TokenKind::string) refuse();
  return take();
}

Statement Parser::drop() {
  static constexpr std::pair<std::string_view, Drop::Kind> kKinds[] = {{"table", Drop::Kind::table},
                                                                       {"view", Drop::Kind::view},
                                                                       {"index", Drop::Kind::index},
                                                                       {"synonym", Drop::Kind::synonym},
                                                                       {"login", Drop::Kind::login}};
  take();
  for (const auto& [word, kind] : kKinds) {
    if (!takeWord(word)) continue;
    Drop drop;
    drop.kind = kind;
    drop.name = objectName();
    if (kind != Drop::Kind::index) return drop;
    expectWord("on");
    drop.table = objectName();
    return drop;
  }
  refuse();
}

}  // namespace QVSa::tsql
