// Any bytes at all end in trees or in a Failure, and a tree survives being printed and read again.

#include <cstdlib>
#include <iostream>

#include "QVSa/frame/Failure.h"
#include "providers/tsql/OuterJoins.h"
#include "tests/tsql/TreeText.h"

namespace QVSa::tsql {
namespace {

constexpr Long kTooDeep = 191;
constexpr Long kTooManyTables = 106;

[[noreturn]] void report(const String& what, const String& first, const String& second) {
  std::cerr << what << "\n" << first << "\n" << second << "\n";
  std::abort();
}

void checkPrint(const Statement& statement) {
  const String text = print(statement);
  try {
    const std::vector<Statement> again = parseText(text);
    if (again.size() != 1) report("not one statement", text, "");
    if (treeOf(again[0]) != treeOf(statement)) report("another tree", treeOf(statement), treeOf(again[0]));
  } catch (const Failure& failure) {
    // Parentheses of the printer's own, or joins that were a list, may reach a limit that the original kept.
    if (failure.native() != kTooDeep && failure.native() != kTooManyTables)
      report("no longer read", text, failure.description());
  }
}

void checkBatch(const String& batch) {
  const std::vector<Token> tokens = tokenize(batch);
  const String shape = shapeOf(tokens);
  if (shape.empty() != (tokens.size() == 1)) report("no shape", batch, shape);
  for (Statement& statement : parse(tokens)) {
    checkPrint(statement);
    rewriteOuterJoins(statement);
    checkPrint(statement);
  }
}

}  // namespace
}  // namespace QVSa::tsql

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  try {
    QVSa::tsql::checkBatch(QVSa::String(data, data + size));
  } catch (const QVSa::Failure&) {
    return 0;
  }
  return 0;
}
