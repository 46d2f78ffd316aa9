#include "providers/embedded/storage/NullIndex.h"

#include <algorithm>

namespace QVSa::embedded {

namespace {

// Two points: an index of the dialect has one between its table's name and its own.
constexpr std::string_view mark = "..";
constexpr std::string_view ownKey = "key ";
constexpr std::string_view messageBegin = "index '";

std::string nameOf(const TableInfo& table, const std::string& key) {
  return std::string(databaseNames[table.database]) + "." +
         quoteName(foldName(table.name) + std::string(mark) + foldName(key));
}

// A NULL counts as an empty list of bytes, which no other value of the column equals.
std::string keyColumn(const ColumnInfo& column) {
  const std::string value = "ifnull(" + quoteName(column.name) + ",x'')";
  return column.type.isText() ? value + " collate tsql" : value;
}

}  // namespace

std::string makeNullIndex(const TableInfo& table, const std::vector<std::string>& columns, const std::string& key,
                          std::size_t ordinal) {
  std::string values, anyNull;
  for (const auto& name : columns) {
    const ColumnInfo& column = table.columns[*table.find(name)];
    values += (values.empty() ? "" : ",") + keyColumn(column);
    if (column.nullable) anyNull += (anyNull.empty() ? "" : " or ") + quoteName(column.name) + " is null";
  }
  if (anyNull.empty()) return {};
  const std::string own = key.empty() ? std::string(ownKey) + std::to_string(ordinal) : key;
  return "create unique index " + nameOf(table, own) + " on " + quoteName(table.name) + "(" + values + ") where " +
         anyNull;
}

std::string dropNullIndex(const TableInfo& table, const std::string& key) {
  return "drop index if exists " + nameOf(table, key);
}

std::optional<std::pair<std::string, std::string>> readNullIndex(const std::string& message) {
  if (!message.starts_with(messageBegin)) return std::nullopt;
  const std::string name = message.substr(messageBegin.size(), message.size() - messageBegin.size() - 1);
  const std::size_t middle = name.rfind(mark);
  if (middle == std::string::npos) return std::nullopt;
  std::string key = name.substr(middle + mark.size());
  if (key.starts_with(ownKey)) key.clear();
  return std::pair(name.substr(0, middle), key);
}

}  // namespace QVSa::embedded
