#include "providers/tsql/Dialect.h"

namespace QVSa::tsql {
namespace {

String wordFor(Takes takes) {
  switch (takes) {
    case Takes::anything:
      return "any";
    case Takes::text:
      return "text";
    case Takes::whole:
      return "int";
    case Takes::real:
      return "float";
    case Takes::number:
      return "number";
    case Takes::exact:
      return "number, no float";
    case Takes::integral:
      return "whole number";
    case Takes::summable:
      return "number, no bit";
    case Takes::comparable:
      return "any but bit, ntext, image";
    case Takes::moment:
      return "datetime";
    case Takes::first:
      return "as the first";
    case Takes::common:
      return "any of one type";
    case Takes::datePart:
      return "part of a date";
    case Takes::type:
      return "type";
    case Takes::style:
      return "style";
    case Takes::condition:
      return "condition";
    case Takes::list:
      return "values or a select";
  }
  return {};
}

String wordFor(Gives gives) {
  switch (gives) {
    case Gives::condition:
      return "condition";
    case Gives::whole:
      return "int";
    case Gives::identity:
      return "numeric(38,0)";
    case Gives::moment:
      return "datetime";
    case Gives::shortText:
      return "varchar";
    case Gives::first:
      return "as the first operand";
    case Gives::cutText:
      return "text, cut at 8,000 bytes unless an operand is long";
    case Gives::joinedText:
      return "text";
    case Gives::common:
      return "the type that all meet in";
    case Gives::arithmetic:
      return "the type that both meet in, int at least; decimals by SQL Server's rules";
    case Gives::floor:
      return "as the operand, without digits behind the point";
    case Gives::total:
      return "as the operand, int at least; numeric(38,s)";
    case Gives::average:
      return "as the operand, int at least; numeric(38,s) with s 6 at least";
    case Gives::named:
      return "the type that is named";
  }
  return {};
}

String countOf(const Operation& row) {
  if (row.most == Operation::open) return std::to_string(row.least) + " or more";
  if (row.least == row.most) return std::to_string(row.least);
  return std::to_string(row.least) + " to " + std::to_string(row.most);
}

String operandsOf(const Operation& row) {
  const bool isOpen = row.most == Operation::open;
  String text;
  for (std::size_t i = 0; i < (isOpen ? row.least : row.most); ++i) {
    text += i == 0 ? "" : "; ";
    text += wordFor(row.operand(i));
  }
  return isOpen ? text + "; ..." : text;
}

// A "|" within a table has to be told from its lines.
String nameOf(const Operation& row) { return row.name == "|" ? "\\|" : String(row.name); }

void addRow(String& text, const Operation& row) {
  text += "| `" + nameOf(row) + "` | " + countOf(row) + " | " + operandsOf(row) + " | " + wordFor(row.gives) + " |\n";
}

}  // namespace

String dialectReference() {
  String functions = "| function | operands | each | result |\n|---|---|---|---|\n";
  String operators = "| operator | operands | each | result |\n|---|---|---|---|\n";
  for (const Operation& row : dialect()) addRow(row.form <= Form::conversion ? functions : operators, row);
  return functions + "\n" + operators;
}

}  // namespace QVSa::tsql
