#include "providers/embedded/Emitter.h"

namespace QVSa::embedded {

namespace {

template <class List, class Write>
std::string joined(const List& list, const std::string& separator, Write write) {
  std::string text;
  for (const auto& item : list) {
    if (!text.empty()) text += separator;
    text += write(item);
  }
  return text;
}

std::string expressions(const std::vector<BoundPtr>& list, const std::string& separator = ",") {
  return joined(list, separator, [](const BoundPtr& item) { return emit(*item); });
}

std::string parameterName(std::size_t parameter) { return "?" + std::to_string(parameter + 1); }

std::string tableName(const TableInfo& table) {
  return std::string(databaseNames[table.database]) + "." + quoteName(table.name);
}

std::string negation(const BoundExpression& expression) { return expression.negated ? " not" : ""; }

std::string emitCase(const BoundExpression& expression) {
  std::string text = "(case";
  const std::size_t paired = expression.operands.size() / 2 * 2;
  for (std::size_t i = 0; i < paired; i += 2)
    text += " when " + emit(*expression.operands[i]) + " then " + emit(*expression.operands[i + 1]);
  if (paired < expression.operands.size()) text += " else " + emit(*expression.operands.back());
  return text + " end)";
}

std::string emitSource(const BoundSource& source) {
  std::string text = source.table                 ? tableName(*source.table)
                     : source.commonTable.empty() ? "(" + emit(*source.derived) + ")"
                                                  : source.commonTable;
  text += " as " + source.alias;
  if (source.leftJoin) text += " on " + emit(*source.on);
  return text;
}

std::string emitFrom(const std::vector<BoundSource>& from) {
  std::string text;
  for (const auto& source : from) {
    if (!text.empty()) text += source.leftJoin ? " left join " : source.crossJoin ? " cross join " : ",";
    text += emitSource(source);
  }
  return text;
}

std::string emitWhere(const std::vector<BoundPtr>& where) {
  return where.empty() ? "" : " where " + expressions(where, " and ");
}

std::string emitCore(const BoundCore& core) {
  std::string text = core.distinct ? "select distinct " : "select ";
  std::size_t column = 0;
  text += joined(core.items, ",",
                 [&](const BoundItem& item) { return emit(*item.expression) + " as c" + std::to_string(column++); });
  if (!core.from.empty()) text += " from " + emitFrom(core.from);
  text += emitWhere(core.where);
  if (!core.groupBy.empty()) text += " group by " + expressions(core.groupBy);
  if (core.having) text += (core.groupBy.empty() ? " group by null having " : " having ") + emit(*core.having);
  return text;
}

std::string emitWith(const std::vector<BoundSelect::CommonTable>& with) {
  if (with.empty()) return "";
  return "with recursive " +
         joined(with, ",",
                [](const BoundSelect::CommonTable& table) {
                  std::string columns;
                  for (std::size_t i = 0; i < table.columns; ++i) columns += (i ? ",c" : "c") + std::to_string(i);
                  return table.name + "(" + columns + ") as (" + emit(*table.select) + ")";
                }) +
         " ";
}

std::string emitOrder(const std::vector<BoundOrder>& orderBy) {
  if (orderBy.empty()) return "";
  return " order by " + joined(orderBy, ",", [](const BoundOrder& order) {
           return (order.expression ? emit(*order.expression) : std::to_string(order.ordinal)) +
                  (order.descending ? " desc" : "");
         });
}

// A limit of one part of a union stands inside it, that of a single block behind its order.
std::string emitPart(const BoundCore& core, bool alone) {
  if (alone || !core.top) return emitCore(core);
  return "select * from (" + emitCore(core) + " limit " + parameterName(*core.top) + ")";
}

}  // namespace

std::string emit(const BoundExpression& expression) {
  using Kind = BoundExpression::Kind;
  const auto operand = [&](std::size_t i) { return emit(*expression.operands[i]); };
  switch (expression.kind) {
    case Kind::null:
      return "null";
    case Kind::parameter:
      return parameterName(expression.parameter);
    case Kind::column:
      return expression.source + "." + expression.text;
    case Kind::rowid:
      return expression.source + ".rowid";
    case Kind::constant:
      return expression.text;
    case Kind::call:
      return expression.text + "(" + (expression.distinct ? "distinct " : "") + expressions(expression.operands) + ")";
    case Kind::prefix:
      return "(" + expression.text + " " + operand(0) + ")";
    case Kind::infix:
      return "(" + operand(0) + " " + expression.text + " " + operand(1) + ")";
    case Kind::isNull:
      return "(" + operand(0) + (expression.negated ? " is not null)" : " is null)");
    case Kind::between:
      return "(" + operand(0) + negation(expression) + " between " + operand(1) + " and " + operand(2) + ")";
    case Kind::caseOf:
      return emitCase(expression);
    case Kind::inValues: {
      std::string items;
      for (std::size_t i = 1; i < expression.operands.size(); ++i) items += (i > 1 ? "," : "") + operand(i);
      return "(" + operand(0) + negation(expression) + " in (" + items + "))";
    }
    case Kind::inList:
      return "(" + operand(0) + negation(expression) + " in (select value from list(" +
             parameterName(expression.parameter) + ")))";
    case Kind::inSelect:
      return "(" + operand(0) + negation(expression) + " in (" + emit(*expression.select) + "))";
    case Kind::exists:
      return "(" + std::string(expression.negated ? "not " : "") + "exists (" + emit(*expression.select) + "))";
    case Kind::subquery:
      return "(" + emit(*expression.select) + ")";
  }
  return "";
}

std::string emit(const BoundSelect& select) {
  std::string text = emitWith(select.with);
  const bool alone = select.parts.size() == 1;
  for (const auto& part : select.parts) {
    if (&part != &select.parts.front()) text += part.all ? " union all " : " union ";
    text += emitPart(part.core, alone);
  }
  text += emitOrder(select.orderBy);
  if (alone && select.parts.front().core.top) text += " limit " + parameterName(*select.parts.front().core.top);
  return text;
}

std::string emit(const BoundInsert& insert) {
  std::string text =
      "insert into " + tableName(*insert.table) + "(" +
      joined(insert.columns, ",", [&](std::size_t column) { return quoteName(insert.table->columns[column].name); }) +
      ") ";
  if (insert.select) return text + emit(*insert.select);
  return text + "values " +
         joined(insert.rows, ",", [](const std::vector<BoundPtr>& row) { return "(" + expressions(row) + ")"; });
}

std::string emit(const BoundUpdate& update) {
  std::size_t value = 0;
  std::string text = "update " + tableName(*update.table) + " as " + update.alias + " set " +
                     joined(update.assignments, ",", [&](const auto& assignment) {
                       return quoteName(update.table->columns[assignment.first].name) + "=" +
                              (update.from ? "n.c" + std::to_string(++value) : emit(*assignment.second));
                     });
  if (!update.from) return text + emitWhere(update.where);
  return text + " from (" + emit(*update.from) + ") as n where " + update.alias + ".rowid=n.c0";
}

std::string emit(const BoundDelete& erase) {
  const std::string text = "delete from " + tableName(*erase.table);
  if (erase.from) return text + " where rowid in (" + emit(*erase.from) + ")";
  return text + " as " + erase.alias + emitWhere(erase.where);
}

}  // namespace QVSa::embedded
