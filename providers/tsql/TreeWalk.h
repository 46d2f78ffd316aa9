#pragma once

#include "providers/tsql/Tree.h"

// Walks over a tree. `Node` is Expression or TableSource, constant or not; nothing here enters a select on its own.
namespace QVSa::tsql {

// The expression and all below it, from the top down.
template <typename Node, typename Visit>
void walkExpression(Node& expression, const Visit& visit) {
  visit(expression);
  const auto below = [&](const ExpressionPtr& part) {
    if (part) walkExpression(static_cast<Node&>(*part), visit);
  };
  for (const ExpressionPtr& operand : expression.operands) below(operand);
  for (const WhenBranch& branch : expression.branches) {
    below(branch.operand);
    below(branch.when);
    below(branch.then);
  }
  below(expression.otherwise);
}

// The source and, of a join, both sides.
template <typename Node, typename Visit>
void walkSource(Node& source, const Visit& visit) {
  visit(source);
  if (source.left) walkSource(static_cast<Node&>(*source.left), visit);
  if (source.right) walkSource(static_cast<Node&>(*source.right), visit);
}

// The tables of all blocks of a select first, then its expressions; a derived table is a table, and not entered.
template <typename VisitTable, typename VisitExpression>
void walkSelect(const Select& select, const VisitTable& visitTable, const VisitExpression& visitExpression) {
  const auto visit = [&](const ExpressionPtr& expression) {
    if (expression) visitExpression(static_cast<const Expression&>(*expression));
  };
  for (const Select::Part& part : select.parts)
    for (const TableSourcePtr& source : part.core.from)
      walkSource(static_cast<const TableSource&>(*source), [&](const TableSource& inner) {
        if (inner.kind != TableSource::Kind::join) visitTable(inner);
      });
  for (const Select::Part& part : select.parts) {
    for (const TableSourcePtr& source : part.core.from)
      walkSource(static_cast<const TableSource&>(*source), [&](const TableSource& inner) { visit(inner.on); });
    for (const SelectItem& item : part.core.items) visit(item.expression);
    visit(part.core.where);
    for (const ExpressionPtr& key : part.core.groupBy) visit(key);
    visit(part.core.having);
  }
  for (const OrderItem& item : select.orderBy) visit(item.expression);
}

// The name by which columns of a table or derived table are qualified.
inline const String& exposedName(const TableSource& source) { return source.alias ? *source.alias : source.table.name; }

}  // namespace QVSa::tsql
