#pragma once

#include <string_view>

namespace QVSa::database {

// The scripts that fill the three databases of an installation, each to be run once in its own, empty database: tables,
// keys, views, synonyms and first rows, in plain T-SQL with GO between the batches. QVSys comes first, QVApp refers to
// it.
extern const std::string_view qvSys;
extern const std::string_view qvApp;
extern const std::string_view qvUpdate;

// What brings a database that was filled by an earlier release from one layout to the next: the number is the one that
// it has afterwards.
extern const std::string_view qvSys2;

}  // namespace QVSa::database
