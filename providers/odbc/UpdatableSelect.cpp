#include "providers/odbc/UpdatableSelect.h"

#include <algorithm>

#include "QVSa/values/Failure.h"
#include "providers/odbc/ObjectText.h"
#include "providers/tsql/Parser.h"
#include "providers/tsql/Printer.h"

namespace QVSa::odbc {

namespace {

using tsql::Expression;

unsigned char lower(unsigned char c) { return c >= 'A' && c <= 'Z' ? static_cast<unsigned char>(c + 32) : c; }

bool sameName(const String& a, const String& b) {
  return std::equal(a.begin(), a.end(), b.begin(), b.end(), [](char x, char y) {
    return lower(static_cast<unsigned char>(x)) == lower(static_cast<unsigned char>(y));
  });
}

bool isPlain(const tsql::SelectItem& item) {
  return item.expression->kind == Expression::Kind::column || item.expression->kind == Expression::Kind::star;
}

bool readsOneTable(const tsql::Select& select) {
  if (!select.with.empty() || select.parts.size() != 1) return false;
  const tsql::SelectCore& core = select.parts.front().core;
  if (core.distinct || core.having || !core.groupBy.empty() || core.from.size() != 1) return false;
  return core.from.front()->kind == tsql::TableSource::Kind::table &&
         std::all_of(core.items.begin(), core.items.end(), isPlain);
}

std::vector<tsql::Statement> statementsOf(const String& batch) {
  try {
    return tsql::parse(tsql::tokenize(batch));
  } catch (const Failure&) {
    // The server may know what the reader here does not, or will tell what is wrong with it.
    return {};
  }
}

}  // namespace

std::optional<UpdatableSelect> UpdatableSelect::of(const String& batch) {
  auto statements = statementsOf(batch);
  if (statements.size() != 1) return std::nullopt;
  auto* select = std::get_if<tsql::SelectPtr>(&statements.front());
  if (!select || !readsOneTable(**select)) return std::nullopt;
  return UpdatableSelect(std::move(*select));
}

const tsql::ObjectName& UpdatableSelect::table() const { return core().from.front()->table; }

bool UpdatableSelect::selectsAll() const {
  return std::any_of(core().items.begin(), core().items.end(),
                     [](const tsql::SelectItem& item) { return item.expression->kind == Expression::Kind::star; });
}

bool UpdatableSelect::selects(const String& column) const {
  return std::any_of(core().items.begin(), core().items.end(),
                     [&](const tsql::SelectItem& item) { return sameName(item.expression->name, column); });
}

void UpdatableSelect::addKey(const std::vector<String>& key) {
  key_ = key;
  // A column that stands there twice would make an order by its name ambiguous.
  if (selectsAll()) return;
  for (const String& column : key) {
    if (selects(column)) continue;
    auto expression = std::make_unique<Expression>(Expression::Kind::column);
    expression->name = column;
    core().items.push_back({std::move(expression), std::nullopt});
    ++added_;
  }
}

String UpdatableSelect::text() const { return tsql::print(*select_); }

RowWriter UpdatableSelect::writer(const std::vector<Column>& columns, const std::vector<ColumnType>& types,
                                  std::chrono::seconds timeout) const {
  RowWriter result{objectText(table()), {}, types, {}, timeout};
  const bool all = selectsAll();
  for (std::size_t ordinal = 0; ordinal < columns.size(); ++ordinal) {
    // An alias is the row set's name, not the table's.
    result.columns.push_back(all ? columns[ordinal].name : core().items[ordinal].expression->name);
  }
  for (const String& column : key_) {
    const auto at = std::find_if(result.columns.begin(), result.columns.end(),
                                 [&](const String& name) { return sameName(name, column); });
    result.key.push_back(static_cast<std::size_t>(at - result.columns.begin()));
  }
  return result;
}

}  // namespace QVSa::odbc
