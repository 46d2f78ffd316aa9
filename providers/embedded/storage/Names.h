#pragma once

#include <cstddef>
#include <optional>
#include <string>

namespace QVSa::embedded {

// Everything belongs to one owner, "dbo", who need not be named.
bool isOwner(const std::string& name);

// The position of a database by its name, any case; nothing for an unknown one.
std::optional<std::size_t> databaseByName(const std::string& name);

// A name as names are compared: without regard to case.
std::string foldName(const std::string& name);
bool sameName(const std::string& a, const std::string& b);
// A name as SQLite's SQL holds it: "name", quotation marks doubled.
std::string quoteName(const std::string& name);

}  // namespace QVSa::embedded
