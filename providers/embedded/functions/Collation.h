#pragma once

#include <string>
#include <string_view>

struct sqlite3;

namespace QVSa::embedded {

// The one order of texts: without regard to case and trailing blanks, then by code points, the shorter first. Negative,
// 0 or positive. It is frozen with the layout of the files, whose indices rest on it.
int compareText(std::string_view a, std::string_view b);

// Makes it known to a handle as the collation "tsql".
void registerCollation(sqlite3* handle);

}  // namespace QVSa::embedded
