#pragma once

#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "providers/embedded/bind/Types.h"
#include "providers/embedded/functions/Conversions.h"
#include "providers/embedded/storage/Catalogue.h"

// The bound tree: what the binder makes of a statement once every name is found, every expression has a type and every
// conversion that the dialect makes by itself stands in it. The emitter writes it as SQLite's SQL.
namespace QVSa::embedded {

struct BoundSelect;
struct BoundExpression;
using BoundPtr = std::unique_ptr<BoundExpression>;
using BoundSelectPtr = std::unique_ptr<BoundSelect>;

struct BoundExpression {
  enum class Kind {
    null,
    parameter,  // ?n
    column,     // source.name
    rowid,      // source._rowid_, the key that SQLite gives every row
    constant,   // a text of SQLite's own, such as a type code
    call,       // text(operands), `distinct` for an aggregate; count(*) has the operand constant *
    prefix,     // text operands[0]
    infix,      // operands with text between them
    isNull,     // operands[0] is [not] null
    between,    // operands[0] [not] between operands[1] and operands[2]
    caseOf,     // case when o[0] then o[1] when o[2] then o[3] ... [else o.back()]
    inValues,   // operands[0] [not] in (operands[1], ...)
    inList,     // operands[0] [not] in the list bound to `parameter`
    inSelect,   // operands[0] [not] in (select)
    exists,     // exists (select)
    subquery,   // (select)
  };

  Kind kind = Kind::null;
  Type type;
  std::string text;
  std::string source;
  std::size_t parameter = 0;
  std::vector<BoundPtr> operands;
  BoundSelectPtr select;
  bool negated = false;
  bool distinct = false;
  // Compares by the dialect's collation without being told: a column of a table.
  bool collated = false;
  bool aggregate = false;
};

// A parameter of the emitted text and where its value comes from.
struct Parameter {
  enum class Source {
    literal,     // the literal of that number, converted
    list,        // the list literal of that number, each item converted
    prefixLow,   // the lower bound of what a like pattern can match
    prefixHigh,  // the upper bound
    lockedRows,  // keys of the rows that this session holds locked
  };
  Source source = Source::literal;
  std::size_t literal = 0;
  std::shared_ptr<const tsql::Token> own;  // in the statement's place: a literal of a view or of a column's default
  std::string text;                        // of the literal, to tell two of them apart
  bool structural = false;                 // the statement's text rests on the literal's value
  bool negate = false;
  bool converted = false;  // the three below say what the statement asks for; until then, what the literal is
  Type type;
  Purpose purpose = Purpose::compute;
  int style = 0;
};

struct BoundItem {
  BoundPtr expression;
  std::string name;
  // The column of the table that this item simply reads; none for a computed one.
  std::optional<std::size_t> tableColumn;
  bool aliased = false;
};

struct BoundSource {
  std::string alias{};               // unique in the statement
  const TableInfo* table = nullptr;  // a table; or
  std::string commonTable{};         // a common table by its emitted name; or
  BoundSelectPtr derived{};          // a derived table, a view
  // Left joins hang on what stands before them.
  bool leftJoin = false;
  // Written as a cross join: read after what stands before it, as the text's author chose.
  bool crossJoin = false;
  BoundPtr on{};
  std::size_t tables = 1;  // that stand here, those of a derived table counted
};

struct BoundCore {
  bool distinct = false;
  std::optional<std::size_t> top;  // parameter
  std::vector<BoundItem> items;
  std::vector<BoundSource> from;
  std::vector<BoundPtr> where;  // all of them hold
  std::vector<BoundPtr> groupBy;
  BoundPtr having;
};

struct BoundOrder {
  std::size_t ordinal = 0;  // of a result column, from 1; or
  BoundPtr expression;
  bool descending = false;
};

struct BoundSelect {
  struct Part {
    bool all = false;
    BoundCore core;
  };
  struct CommonTable {
    std::string name;
    std::size_t columns = 0;
    BoundSelectPtr select;
  };
  std::vector<CommonTable> with;
  std::vector<Part> parts;
  std::vector<BoundOrder> orderBy;
};

// The rows that a select with lock hints takes.
struct RowClaim {
  const TableInfo* table = nullptr;
  BoundSelectPtr candidates;  // their keys
  bool lock = false;          // xlock: take the row
  bool skip = false;          // readpast: pass over rows that another session holds
};

struct BoundQuery {
  BoundSelectPtr select;
  std::optional<RowClaim> claim;
  // The one table whose rows are written back, with the row's key as a last, hidden item.
  const TableInfo* updatable = nullptr;
};

struct BoundInsert {
  const TableInfo* table = nullptr;
  std::vector<std::size_t> columns;
  std::vector<std::vector<BoundPtr>> rows;
  BoundSelectPtr select;
  bool givesIdentity = false;
};

struct BoundUpdate {
  const TableInfo* table = nullptr;
  std::string alias;
  std::vector<std::pair<std::size_t, BoundPtr>> assignments;
  std::vector<BoundPtr> where;
  // With a from clause: key and new values come from this query; `assignments` then name its columns in order.
  BoundSelectPtr from;
};

struct BoundDelete {
  const TableInfo* table = nullptr;
  std::string alias;
  std::vector<BoundPtr> where;
  BoundSelectPtr from;  // the keys of the rows to delete
};

}  // namespace QVSa::embedded
