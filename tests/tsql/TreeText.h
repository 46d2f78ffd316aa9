#pragma once

#include <string>

#include "providers/tsql/Parser.h"
#include "providers/tsql/Printer.h"

// Trees as text with every level in parentheses, operators first: what a printed statement leaves to precedence shows.
namespace QVSa::tsql {

// A product is written as a cross join, and so is read as one.
inline TableSource::Join joinOf(const TableSource& source) {
  using Join = tsql::TableSource::Join;
  return source.join == Join::product ? Join::cross : source.join;
}

inline String treeOf(const Select& select);
inline String treeOf(const Expression& expression);

inline String treeOf(const ExpressionPtr& expression) { return expression ? treeOf(*expression) : "-"; }

template <typename Items>
String treesOf(const Items& items) {
  String text;
  for (const auto& item : items) text += " " + treeOf(item);
  return text;
}

inline String dotted(const std::vector<String>& qualifier, const String& name) {
  String text;
  for (const String& part : qualifier) text += part + ".";
  return text + name;
}

inline String treeOf(const Token& token) {
  String text = token.text;
  for (const Token& item : token.items) text += " " + treeOf(item);
  if (token.kind == TokenKind::list) return "[" + text.substr(1) + "]";
  return token.kind == TokenKind::string ? "'" + text + "'" : text;
}

inline String treeOf(const WhenBranch& branch) {
  const String opening = branch.inElse ? "case " + treeOf(branch.operand) + " " : "";
  return opening + treeOf(branch.when) + "=>" + treeOf(branch.then);
}

inline String headOf(const Expression& expression) {
  using Kind = Expression::Kind;
  switch (expression.kind) {
    case Kind::negation:
      return "not";
    case Kind::isNull:
      return "null?";
    case Kind::between:
      return "between";
    case Kind::like:
      return "like";
    case Kind::in:
      return "in";
    case Kind::exists:
      return "exists";
    case Kind::subquery:
      return "value";
    case Kind::caseOf:
      return "case";
    case Kind::convert:
      return expression.name + ":" + print(expression.type);
    default:
      return expression.op + expression.name;
  }
}

inline String chainOf(const Expression& chain) {
  String text = treeOf(chain.operands[0]);
  for (std::size_t i = 1; i < chain.operands.size(); ++i)
    text = "(" + chain.op.substr(i - 1, 1) + " " + text + " " + treeOf(chain.operands[i]) + ")";
  return text;
}

inline String treeOf(const Expression& expression) {
  using Kind = Expression::Kind;
  if (expression.kind == Kind::binary) return chainOf(expression);
  if (expression.kind == Kind::null) return "null";
  if (expression.kind == Kind::literal || expression.kind == Kind::list) return treeOf(expression.token);
  if (expression.kind == Kind::column) return dotted(expression.qualifier, expression.name);
  if (expression.kind == Kind::star) return dotted(expression.qualifier, "*");
  String text = "(" + String(expression.negated ? "not-" : "") + headOf(expression);
  if (expression.distinct) text += " distinct";
  if (!expression.datePart.empty()) text += " " + expression.datePart;
  text += treesOf(expression.operands) + treesOf(expression.branches);
  if (expression.otherwise) text += " else=>" + treeOf(expression.otherwise);
  if (expression.select) text += " " + treeOf(*expression.select);
  return text + ")";
}

inline String treeOf(const SelectItem& item) { return treeOf(item.expression) + (item.alias ? ":" + *item.alias : ""); }

inline String treeOf(const OrderItem& item) { return treeOf(item.expression) + (item.descending ? "!" : ""); }

inline String treeOf(const TableSource& source) {
  if (source.kind == TableSource::Kind::join)
    return "(join" + std::to_string(static_cast<int>(joinOf(source))) + " " + treeOf(*source.left) + " " +
           treeOf(*source.right) + " " + treeOf(source.on) + ")";
  String text = source.derived ? treeOf(*source.derived) : source.table.database + "." + source.table.name;
  if (source.alias) text += ":" + *source.alias;
  for (const String& hint : source.hints) text += "/" + hint;
  return text;
}

inline String treeOf(const TableSourcePtr& source) { return treeOf(*source); }

inline String treeOf(const Select::Part& part) {
  const SelectCore& core = part.core;
  return String(part.all ? "{all" : "{") + (core.distinct ? "distinct" : "") + (core.top ? core.top->text : "") +
         treesOf(core.items) + " from" + treesOf(core.from) + " where " + treeOf(core.where) + " group" +
         treesOf(core.groupBy) + " having " + treeOf(core.having) + "}";
}

inline String treeOf(const Select& select) {
  String text;
  for (const Select::CommonTable& table : select.with) text += table.name + ":" + treeOf(*table.select) + " ";
  return text + treesOf(select.parts) + " order" + treesOf(select.orderBy);
}

inline String treeOf(const SelectPtr& select) { return select ? treeOf(*select) : "-"; }
inline String treeOf(const Assignment& set) { return dotted(set.qualifier, set.column) + "=" + treeOf(set.value); }
inline String treeOf(const std::vector<ExpressionPtr>& row) { return "(" + treesOf(row) + ")"; }
inline String treeOf(const ColumnDefinition& column) { return column.name + "=" + treeOf(column.defaultValue); }

// The expressions of a statement; its other parts are as they are printed.
struct StatementTree {
  String operator()(const SelectPtr& select) const { return treeOf(*select); }
  String operator()(const Insert& insert) const { return treesOf(insert.values) + treeOf(insert.select); }
  String operator()(const Update& update) const {
    return treesOf(update.assignments) + treesOf(update.from) + treeOf(update.where);
  }
  String operator()(const Delete& erase) const { return treesOf(erase.from) + treeOf(erase.where); }
  String operator()(const CreateTable& table) const { return treesOf(table.columns); }
  String operator()(const CreateView& view) const { return treeOf(*view.select); }
  String operator()(const Call& call) const { return treesOf(call.arguments); }
  template <typename Other>
  String operator()(const Other&) const {
    return {};
  }
};

inline String treeOf(const Statement& statement) {
  return print(statement) + "\n" + std::visit(StatementTree{}, statement);
}

inline std::vector<Statement> parseText(const String& batch) { return parse(tokenize(batch)); }

}  // namespace QVSa::tsql
