#pragma once

#include "tests/support/TestInstallation.h"

namespace QVSa::test {

// Runs the cases of a folder's files, "*.test", each file in QVSys of an installation of its own. A line is a batch to
// be taken: one that begins with a number and a colon is refused by that number, or by one of several; behind an arrow
// stand the rows, a semicolon between two, or "none". A case of several lines opens with "statement ok", "statement
// error" and the numbers, or "query", and has its rows under "----".
void runCases(const std::filesystem::path& folder, TestInstallation::Content content);

}  // namespace QVSa::test
