#pragma once

#include "providers/embedded/Types.h"
#include "providers/tsql/Lexer.h"

namespace QVSa::embedded {

Type literalType(tsql::TokenKind kind);

// The literal's value as it lies in a file. Throws 8115 for a number beyond what a double holds.
Value literalValue(const tsql::Token& token, bool negate);

// What every match of a like pattern begins with: the pattern up to its first special character.
std::string likePrefix(const std::string& pattern);

}  // namespace QVSa::embedded
