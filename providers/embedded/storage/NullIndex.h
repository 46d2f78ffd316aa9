#pragma once

#include <optional>
#include <string>
#include <utility>

#include "providers/embedded/storage/Catalogue.h"

// SQLite takes any number of NULLs in a unique key; the dialect takes one. A unique key over columns that may be NULL
// therefore has a second index beside it, over the rows with a NULL alone.
namespace QVSa::embedded {

// The statement that makes it; empty where no column of the key may be NULL. `key` tells the keys of the table apart:
// the name of an index, or "" and `ordinal` for a key of the table's own.
std::string makeNullIndex(const TableInfo& table, const std::vector<std::string>& columns, const std::string& key,
                          std::size_t ordinal = 0);
std::string dropNullIndex(const TableInfo& table, const std::string& key);

// The table and the index, "" for a key of the table's own, that the library's message "index 'name'" speaks of.
std::optional<std::pair<std::string, std::string>> readNullIndex(const std::string& message);

}  // namespace QVSa::embedded
