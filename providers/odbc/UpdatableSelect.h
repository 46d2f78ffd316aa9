#pragma once

#include <optional>

#include "providers/odbc/RowWriter.h"
#include "providers/tsql/Tree.h"

namespace QVSa::odbc {

// A select whose rows stand each for one row of one table, so that they can be written back.
class UpdatableSelect {
 public:
  // Nothing where the batch is anything else: several statements, a join, a grouping, computed columns.
  static std::optional<UpdatableSelect> of(const String& batch);

  const tsql::ObjectName& table() const;
  // Selects the columns of the primary key too where they are missing.
  void addKey(const std::vector<String>& key);
  // How many columns addKey added, behind the batch's own.
  std::size_t added() const { return added_; }
  String text() const;
  // For the row set with these columns, the added ones among them.
  RowWriter writer(const std::vector<Column>& columns, const std::vector<ColumnType>& types,
                   std::chrono::seconds timeout) const;

 private:
  explicit UpdatableSelect(tsql::SelectPtr select) : select_(std::move(select)) {}
  tsql::SelectCore& core() const { return select_->parts.front().core; }
  bool selectsAll() const;
  bool selects(const String& column) const;

  tsql::SelectPtr select_;
  std::vector<String> key_;
  std::size_t added_ = 0;
};

}  // namespace QVSa::odbc
