#pragma once

#include <optional>
#include <string>
#include <vector>

#include "providers/embedded/bind/Bound.h"

namespace QVSa::embedded {

struct Emitted {
  std::string text;
  std::vector<std::size_t> parameters;  // by their place in the statement's list, in the order of the text's numbers
  std::vector<std::size_t> databases;   // that the text names
};

// Writes bound statements as SQLite's SQL: every table qualified by its database, every literal a numbered parameter,
// result columns named c0, c1, ... by their place. Chains of operators come out flat, whatever their length. Throws 191
// for what is nested deeper than SQLite's parser has room for.
Emitted emit(const BoundSelect& select);
Emitted emit(const BoundInsert& insert);
Emitted emit(const BoundUpdate& update);
Emitted emit(const BoundDelete& erase);
// The keys of the rows in the table that have a key, primary or unique, of a row to insert; nothing where the table has
// no key that the insert gives.
std::optional<Emitted> emitTwins(const BoundInsert& insert);

}  // namespace QVSa::embedded
