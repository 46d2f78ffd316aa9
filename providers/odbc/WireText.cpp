#include "providers/odbc/WireText.h"

#include <algorithm>

#include "QVSa/values/Failure.h"
#include "providers/tsql/OuterJoins.h"
#include "providers/tsql/Parser.h"
#include "providers/tsql/Printer.h"

namespace QVSa::odbc {

namespace {

// A procedure may have any number of row sets.
bool mayHaveRows(const tsql::Statement& statement) {
  return std::holds_alternative<tsql::SelectPtr>(statement) || std::holds_alternative<tsql::Call>(statement);
}

}  // namespace

String wireText(const String& batch) {
  // Most batches have neither sign and need no reading at all.
  if (batch.find("*=") == String::npos && batch.find("=*") == String::npos) return batch;
  const auto tokens = tsql::tokenize(batch);
  if (!tsql::hasOuterJoins(tokens)) return batch;
  String text;
  for (tsql::Statement& statement : tsql::parse(tokens)) {
    tsql::rewriteOuterJoins(statement);
    text += tsql::print(statement) + "\n";
  }
  return text;
}

bool endsWithItsRowSet(const String& batch) {
  try {
    const auto statements = tsql::parse(tsql::tokenize(batch));
    return !statements.empty() && std::holds_alternative<tsql::SelectPtr>(statements.back()) &&
           std::none_of(statements.begin(), statements.end() - 1, mayHaveRows);
  } catch (const Failure&) {
    return false;
  }
}

}  // namespace QVSa::odbc
