#include "providers/odbc/WireBatch.h"

#include <algorithm>

#include "QVSa/values/Failure.h"
#include "QVSa/values/Text.h"
#include "providers/tsql/OuterJoins.h"
#include "providers/tsql/Parser.h"
#include "providers/tsql/Printer.h"

namespace QVSa::odbc {

namespace {

using tsql::Statement;
using tsql::Token;

bool isAscii(const String& text) {
  return std::ranges::all_of(text, [](char c) { return static_cast<unsigned char>(c) < 0x80; });
}

// Marks the literals that need an N and appends their places in the batch.
void markUnicode(std::vector<Token>& tokens, std::vector<std::size_t>& places) {
  for (Token& token : tokens) {
    markUnicode(token.items, places);
    if (token.kind != tsql::TokenKind::string || token.unicode || isAscii(token.text)) continue;
    token.unicode = true;
    places.push_back(token.position);
  }
}

String withPrefixes(const String& batch, const std::vector<std::size_t>& places) {
  String result;
  std::size_t done = 0;
  for (const std::size_t place : places) {
    result += batch.substr(done, place - done) + "N";
    done = place;
  }
  return result + batch.substr(done);
}

String withLeftJoins(std::vector<Statement>& statements) {
  String text;
  for (Statement& statement : statements) {
    tsql::rewriteOuterJoins(statement);
    text += tsql::print(statement) + "\n";
  }
  return text;
}

template <class... Kinds>
bool isAny(const Statement& statement) {
  return (std::holds_alternative<Kinds>(statement) || ...);
}

// A procedure may have any number of row sets.
bool mayHaveRows(const Statement& statement) { return isAny<tsql::SelectPtr, tsql::Call>(statement); }

bool isNocount(const Statement& statement) {
  const auto* set = std::get_if<tsql::SetOption>(&statement);
  return set && set->option == "nocount";
}

bool leavesNoTrace(const Statement& statement) {
  if (const auto* call = std::get_if<tsql::Call>(&statement)) return sameText(call->procedure.name, "sp_getapplock");
  return isNocount(statement) ||
         isAny<tsql::SelectPtr, tsql::Insert, tsql::Update, tsql::Delete, tsql::Use, tsql::Transaction>(statement);
}

bool wantsDatabaseAlone(const Statement& statement) {
  return isAny<tsql::AlterDatabase, tsql::RestoreDatabase>(statement);
}

void learn(WireBatch& batch, const std::vector<Statement>& statements) {
  if (statements.empty()) return;
  batch.endsWithItsRowSet = std::holds_alternative<tsql::SelectPtr>(statements.back()) &&
                            std::none_of(statements.begin(), statements.end() - 1, mayHaveRows);
  // A procedure's bare name is a call at the start of a batch alone.
  batch.canFollow = leavesNoTrace(statements.front()) && !std::holds_alternative<tsql::Call>(statements.front());
  batch.isNocount = statements.size() == 1 && isNocount(statements.front());
  batch.leavesNoTrace = std::ranges::all_of(statements, leavesNoTrace);
  batch.wantsDatabaseAlone = std::ranges::any_of(statements, wantsDatabaseAlone);
}

}  // namespace

WireBatch wireBatch(const String& batch) {
  WireBatch result{batch};
  bool hasOldJoins = false;
  try {
    auto tokens = tsql::tokenize(batch);
    hasOldJoins = tsql::hasOuterJoins(tokens);
    std::vector<std::size_t> places;
    if (!isAscii(batch)) markUnicode(tokens, places);
    result.text = withPrefixes(batch, places);
    auto statements = tsql::parse(tokens);
    learn(result, statements);
    if (hasOldJoins) result.text = withLeftJoins(statements);
  } catch (const Failure&) {
    if (hasOldJoins) throw;
  }
  return result;
}

}  // namespace QVSa::odbc
