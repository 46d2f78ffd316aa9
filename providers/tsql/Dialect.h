#pragma once

#include <array>
#include <cstdint>
#include <span>

#include "QVSa/values/Values.h"

// The dialect in one table: every function and operator that a statement can use, with its counts, its types and the
// form in which it is handed on. The parser takes names and counts from it, a binder the types, and the reference of
// docs/dialect.md is printed from it.
namespace QVSa::tsql {

// What an operand has to be, and what becomes of one that is something else.
enum class Takes : std::uint8_t {
  anything,
  text,        // any value but bytes, as its text
  whole,       // an int, or a number or text that becomes one
  real,        // a float, or a number or text that becomes one
  number,      // a number as it is; a text takes the other operand's type, or becomes a float where there is none
  exact,       // the same, but no float
  integral,    // a whole number as it is, a text as an int
  summable,    // a number as it is, but no bit and no text
  comparable,  // what has an order: no bit, no long text, no bytes
  moment,      // a datetime, or a text or number that becomes one
  first,       // as the first operand is, cut where it is longer
  common,      // as the type that all operands meet in
  datePart,    // the name of a part of a date
  type,        // a type
  style,       // a whole number, written out
  condition,
  list,  // values in parentheses, or a select
};

enum class Gives : std::uint8_t {
  condition,
  whole,       // int
  identity,    // numeric(38,0)
  moment,      // datetime
  shortText,   // varchar
  first,       // the type of the first operand
  cutText,     // the text type of all operands, cut at 8,000 bytes unless it is a long one
  joinedText,  // the text type of all operands, as long as they are together
  common,      // the type that all operands meet in
  arithmetic,  // the same, int at least; decimals by SQL Server's rules for precision and scale
  floor,       // the type of the operand, without digits behind the point
  total,       // int at least; a decimal has 38 digits
  average,     // the same; a decimal has six digits behind the point at least
  named,       // the type that is named
};

// How an operation is written.
enum class Form : std::uint8_t {
  function,    // name(operand, ...)
  aggregate,   // name([distinct] operand)
  conversion,  // convert(type, operand [, style]), cast(operand as type)
  sign,        // name operand
  product,     // operand name operand, of the three strengths
  sum,
  comparison,
  predicate,  // [not] exists, in, like, between, is null
  logical,
};

// What the call that is emitted has behind its operands.
enum class Behind : std::uint8_t {
  nothing,
  type,   // the code of the first operand's type
  limit,  // the most characters of the result, negative where it is refused instead of cut; -1: no limit
};

struct Operation {
  static constexpr std::size_t open = SIZE_MAX;  // any number of operands

  std::string_view name;  // lower case
  Form form = Form::function;
  std::size_t least = 0;
  std::size_t most = 0;
  std::array<Takes, 3> takes{};  // those behind the last one are like it
  Gives gives = Gives::whole;
  std::string_view emitted;  // the function or operator that does it; arithmetic has one for each kind of number
  Behind behind = Behind::nothing;

  Takes operand(std::size_t place) const;
};

// Operators that do different things to different operands have a row for each: the first whose operands fit holds.
std::span<const Operation> dialect();

// By its name, without regard to case; null for an unknown one.
const Operation* functionNamed(std::string_view name);
// The first row of an operator of that form.
const Operation* operatorNamed(std::string_view symbol, Form form);

// Throws 174 or 189 where a call has another number of operands than the function takes.
void checkCount(const Operation& function, std::size_t count);

// The table for people, in Markdown.
String dialectReference();

}  // namespace QVSa::tsql
