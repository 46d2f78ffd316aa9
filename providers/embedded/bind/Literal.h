#pragma once

#include "providers/embedded/bind/Types.h"
#include "providers/tsql/Lexer.h"

namespace QVSa::embedded {

// Of a list: the one that all its items meet in. Throws 1007 for a number of more than 38 digits.
Type literalType(const tsql::Token& token);

// The literal's value as it lies in a file. Throws 8115 for a number beyond what a double holds.
Value literalValue(const tsql::Token& token, bool negate);

// What every match of a like pattern begins with: the pattern up to its first special character.
std::string likePrefix(const std::string& pattern);

}  // namespace QVSa::embedded
