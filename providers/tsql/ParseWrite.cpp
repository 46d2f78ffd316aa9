#include "providers/tsql/ParserState.h"
#include "providers/tsql/SqlFailure.h"

namespace QVSa::tsql {
namespace {

constexpr std::size_t kMostRows = 1000;

void checkRow(const Insert& insert, std::size_t count) {
  if (!insert.columns.empty() && insert.columns.size() > count)
    throw sqlFailure(109,
                     "There are more columns in the INSERT statement than values specified in the VALUES clause. The "
                     "number of values in the VALUES clause must match the number of columns specified in the INSERT "
                     "statement.");
  if (!insert.columns.empty() && insert.columns.size() < count)
    throw sqlFailure(110,
                     "There are fewer columns in the INSERT statement than values specified in the VALUES clause. The "
                     "number of values in the VALUES clause must match the number of columns specified in the INSERT "
                     "statement.");
  if (insert.values.size() == kMostRows)
    throw sqlFailure(
        10738,
        "The number of row value expressions in the INSERT statement exceeds the maximum allowed number of "
        "1000 row values.");
  if (!insert.values.empty() && insert.values.front().size() != count)
    throw sqlFailure(10709, "The number of columns for each row in a table value constructor must be the same.");
}

}  // namespace

Statement Parser::insert() {
  take();
  takeWord("into");
  Insert insert;
  insert.table = objectName();
  if (isSymbol("(")) insert.columns = columnNames();
  if (takeWord("values"))
    insertRows(insert);
  else
    insert.select = select();
  return insert;
}

void Parser::insertRows(Insert& insert) {
  do {
    std::vector<ExpressionPtr> row;
    expectSymbol("(");
    do row.push_back(value());
    while (takeSymbol(","));
    expectSymbol(")");
    checkRow(insert, row.size());
    insert.values.push_back(std::move(row));
  } while (takeSymbol(","));
}

Statement Parser::update() {
  take();
  Update update;
  update.target = objectName();
  update.hints = hints(false);
  expectWord("set");
  do update.assignments.push_back(assignment());
  while (takeSymbol(","));
  if (isWord("from")) update.from = from();
  update.where = where();
  return update;
}

Assignment Parser::assignment() {
  Assignment assignment;
  assignment.position = now().position;
  assignment.qualifier = nameParts(4);
  assignment.column = std::move(assignment.qualifier.back());
  assignment.qualifier.pop_back();
  expectSymbol("=");
  assignment.value = value();
  return assignment;
}

Statement Parser::erase() {
  take();
  takeWord("from");
  Delete erase;
  erase.target = objectName();
  if (isWord("from")) erase.from = from();
  erase.where = where();
  return erase;
}

}  // namespace QVSa::tsql
