#pragma once

#include "providers/tsql/Tree.h"

namespace QVSa::tsql {

// Reads the statements of a batch, which need no semicolon between them. Throws the failure of SQL Server's own number:
// 102 "Incorrect syntax near 'x'.", 156 near a keyword, 174 and 189 for a known function's argument count,
// 195 for an unknown function, 155 for an unknown date part, and so on.
std::vector<Statement> parse(const std::vector<Token>& tokens, Deadline deadline = Deadline());

// Cuts a script at its lines that hold nothing but GO.
std::vector<String> splitScript(const String& script);

}  // namespace QVSa::tsql
