#pragma once

#include <vector>

#include "QVSa/values/Values.h"
#include "providers/tsql/Deadline.h"

namespace QVSa::tsql {

enum class TokenKind {
  word,        // an unquoted identifier or keyword, of any script
  quotedName,  // [name] or "name"; `text` holds the name itself
  variable,    // @name
  integer,     // digits that fit a 32-bit number
  decimal,     // digits with a point, or too large for an integer
  real,        // digits with an exponent
  string,      // 'text' or N'text'; `text` holds the content, doubled quotes undone
  binary,      // 0x...; `text` holds the hexadecimal digits
  list,        // the literals between "in (" and ")", as one token; see Token::items
  symbol,      // an operator or a punctuation mark, *= and =* among them
  end,
};

struct Token {
  TokenKind kind = TokenKind::end;
  String text;               // as described at the kind; a word as it is written
  std::size_t position = 0;  // byte offset in the batch
  std::size_t literal = 0;   // number of the literal within the batch, for the literal kinds and for list
  std::vector<Token> items;  // of a list
  bool reserved = false;     // a word that T-SQL reserves, and so no name without brackets
  bool unicode = false;      // a string written N'text'
};

// Cuts a batch into tokens; the last one is `end`. Comments (-- and nested /* */) are blanks.
// `in (` followed by nothing but literals up to the `)` gives the tokens in, (, list, ).
// Throws the failure of an unclosed quotation mark (105), comment (113), or a stray character (102).
std::vector<Token> tokenize(const String& batch, Deadline deadline = Deadline());

// One of the literal kinds, or a list: what has a number of its own in `Token::literal`, counted from 0.
bool isLiteral(TokenKind kind);

// What the type of a literal rests on, beside its kind. Literals that differ in this differ in shape.
struct LiteralSize {
  std::size_t whole = 0;     // digits of a number before its point, without leading zeros
  std::size_t fraction = 0;  // and behind it
  bool isLong = false;       // a string of more characters than a varchar(n) or nvarchar(n) can have
};
LiteralSize sizeOf(const Token& literal);

// The batch's shape: its text with each literal replaced by a mark of its kind, words folded to one case, blanks made
// one. Two batches of one shape differ in their literals alone. A literal that is no value but part of the statement's
// form stays as it is: the size of a type, the style of a convert, a whole number within an order by (which may be an
// ordinal), a text behind "as". The mark of a list tells the kinds in it, not their number or order; that of a decimal
// its digits, that of a string whether it is Unicode or long.
String shapeOf(const std::vector<Token>& tokens);

}  // namespace QVSa::tsql
