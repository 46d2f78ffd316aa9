#include "providers/tsql/Parser.h"

#include <algorithm>
#include <charconv>

#include "providers/tsql/ParserState.h"
#include "providers/tsql/SqlFailure.h"
#include "providers/tsql/Words.h"

namespace QVSa::tsql {
namespace {

constexpr std::size_t kDeepest = 200;

String dotted(const std::vector<String>& parts) {
  String name;
  for (const String& part : parts) name += (name.empty() ? "" : ".") + part;
  return name;
}

}  // namespace

Parser::Nesting::Nesting(Parser& parser, std::size_t weight) : parser_(parser), weight_(weight) {
  if (parser_.depth_ + weight_ > kDeepest) refuseDepth();
  parser_.depth_ += weight_;
}

std::vector<Statement> Parser::batch() {
  std::vector<Statement> statements;
  for (;;) {
    while (takeSymbol(";")) continue;
    if (now().kind == TokenKind::end) return statements;
    operators_ = 0;
    statements.push_back(statement());
  }
}

Statement Parser::statement() {
  using Reader = Statement (Parser::*)();
  static constexpr std::pair<std::string_view, Reader> kReaders[] = {
      {"select", &Parser::query},
      {"with", &Parser::query},
      {"insert", &Parser::insert},
      {"update", &Parser::update},
      {"delete", &Parser::erase},
      {"create", &Parser::create},
      {"drop", &Parser::drop},
      {"alter", &Parser::alter},
      {"backup", &Parser::backup},
      {"restore", &Parser::restore},
      {"use", &Parser::use},
      {"set", &Parser::setOption},
      {"begin", &Parser::beginTransaction},
      {"commit", &Parser::commitTransaction},
      {"rollback", &Parser::rollbackTransaction},
      {"exec", &Parser::execute},
      {"execute", &Parser::execute},
  };
  for (const auto& [word, reader] : kReaders)
    if (isWord(word)) return (this->*reader)();
  if (at_ == 0 && isName()) return call();
  refuse();
}

const Token& Parser::ahead(std::size_t distance) const { return tokens_[std::min(at_ + distance, tokens_.size() - 1)]; }

bool Parser::isWord(std::string_view word, std::size_t distance) const {
  const Token& token = ahead(distance);
  return token.kind == TokenKind::word && sameWord(token.text, word);
}

bool Parser::isSymbol(std::string_view symbol, std::size_t distance) const {
  const Token& token = ahead(distance);
  return token.kind == TokenKind::symbol && token.text == symbol;
}

bool Parser::isName(std::size_t distance) const {
  const Token& token = ahead(distance);
  return token.kind == TokenKind::quotedName || (token.kind == TokenKind::word && !token.reserved);
}

bool Parser::takeWord(std::string_view word) {
  if (!isWord(word)) return false;
  take();
  return true;
}

bool Parser::takeSymbol(std::string_view symbol) {
  if (!isSymbol(symbol)) return false;
  take();
  return true;
}

void Parser::expectWord(std::string_view word) {
  if (!takeWord(word)) refuse();
}

void Parser::expectSymbol(std::string_view symbol) {
  if (!takeSymbol(symbol)) refuse();
}

String Parser::expectName() {
  if (!isName()) refuse();
  return take().text;
}

String Parser::optionalName() { return isName() ? take().text : String(); }

bool Parser::switchedOn() {
  if (takeWord("on")) return true;
  expectWord("off");
  return false;
}

// Where the batch ends too early, what stands last in it is named, be it a keyword or not.
void Parser::refuse(std::size_t token) const {
  const bool atEnd = tokens_[token].kind == TokenKind::end;
  const Token& near = tokens_[atEnd && token > 0 ? token - 1 : token];
  if (near.reserved && !atEnd) throw sqlFailure(156, "Incorrect syntax near the keyword '" + near.text + "'.");
  throw sqlFailure(102, "Incorrect syntax near '" + near.text + "'.");
}

void Parser::refusePosition(std::size_t position) const {
  std::size_t token = 0;
  while (tokens_[token].kind != TokenKind::end && tokens_[token].position < position) ++token;
  refuse(token);
}

// a, a.b, a..b and so on, of at most `most` parts; only parts in the middle may be missing.
std::vector<String> Parser::nameParts(std::size_t most) {
  std::vector<String> parts{expectName()};
  while (takeSymbol(".")) {
    while (takeSymbol(".")) parts.emplace_back();
    parts.push_back(expectName());
  }
  if (parts.size() <= most) return parts;
  throw sqlFailure(117, "The object name '" + dotted(parts) +
                            "' contains more than the maximum number of prefixes. The " + "maximum is " +
                            std::to_string(most - 1) + ".");
}

ObjectName Parser::objectName() {
  ObjectName name;
  name.position = now().position;
  std::vector<String> parts = nameParts(3);
  name.name = std::move(parts.back());
  if (parts.size() > 1) name.owner = std::move(parts[parts.size() - 2]);
  if (parts.size() > 2) name.database = std::move(parts[0]);
  return name;
}

std::vector<String> Parser::columnNames() {
  std::vector<String> names;
  expectSymbol("(");
  do names.push_back(expectName());
  while (takeSymbol(","));
  expectSymbol(")");
  return names;
}

TypeName Parser::typeName() {
  TypeName type;
  type.name = lowered(expectName());
  if (!takeSymbol("(")) return type;
  if (takeWord("max")) {
    type.size = -1;
  } else {
    type.size = digits();
    if (takeSymbol(",")) type.scale = digits();
  }
  expectSymbol(")");
  return type;
}

std::int64_t Parser::digits() {
  if (now().kind != TokenKind::integer) refuse();
  const String& text = take().text;
  std::int64_t number = 0;
  std::from_chars(text.data(), text.data() + text.size(), number);
  return number;
}

std::int64_t Parser::wholeNumber() { return takeSymbol("-") ? -digits() : digits(); }

std::vector<Statement> parse(const std::vector<Token>& tokens, Deadline deadline) {
  return Parser(tokens, deadline).batch();
}

}  // namespace QVSa::tsql
