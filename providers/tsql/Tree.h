#pragma once

#include <memory>
#include <optional>
#include <variant>
#include <vector>

#include "QVSa/values/Values.h"
#include "providers/tsql/Lexer.h"

// The syntax tree of the dialect. The parser makes it, the printer writes it back as T-SQL, a binder annotates it.
namespace QVSa::tsql {

struct Select;
struct Expression;
using ExpressionPtr = std::unique_ptr<Expression>;
using SelectPtr = std::unique_ptr<Select>;

// A name of one to three parts: object, owner.object, database.owner.object or database..object.
struct ObjectName {
  String database;
  String owner;
  String name;
  std::size_t position = 0;
};

struct TypeName {
  String name;                       // lower case: int, nvarchar, smalldatetime, ...
  std::optional<std::int64_t> size;  // of nvarchar(n); -1 for max; precision of decimal(p, s)
  std::optional<std::int64_t> scale;
};

struct WhenBranch {
  ExpressionPtr when;
  ExpressionPtr then;
  // Begins a case of its own in the else of the one before it: "case .. else case [`operand`] when .. end end". Such a
  // chain may be thousands of cases long, and so stands in one node.
  bool inElse = false;
  ExpressionPtr operand;
};

struct Expression {
  enum class Kind {
    null,
    literal,     // `token`
    list,        // `token` of kind list; only as the right side of in
    column,      // `qualifier` (zero to three parts, the table last) and `name`
    star,        // * or qualifier.*; in a select list, in count(*) and in exists
    unary,       // `op` -, + or ~ on operands[0]
    binary,      // operands, from left to right, with the characters of `op` between them: + - & | ^ or * / %
    comparison,  // `op` = <> < <= > >= and the old joins *= and =* on two operands; != is read as <>, !< as >=, !> as
                 // <=
    logical,     // operands with `op` and, or between them
    negation,    // not operands[0]
    isNull,      // operands[0] is [not] null
    between,     // operands[0] [not] between operands[1] and operands[2]
    like,        // operands[0] [not] like operands[1] [escape operands[2]]
    in,          // operands[0] [not] in (operands[1..]), a list, or `select`
    exists,      // exists (`select`)
    subquery,    // a scalar (`select`)
    function,    // `name`(operands); `distinct` for an aggregate; a date part stands in `datePart`
    convert,     // convert(`type`, operands[0] [, operands[1] as the style]) and cast, told apart by `name`
    caseOf,      // case [operands[0]] `branches` [else `otherwise`] end; see WhenBranch::inElse
  };

  Kind kind = Kind::null;
  std::size_t position = 0;
  String op;
  String name;
  std::vector<String> qualifier;
  Token token;
  bool negated = false;
  bool distinct = false;
  String datePart;
  TypeName type;
  std::vector<ExpressionPtr> operands;
  std::vector<WhenBranch> branches;
  ExpressionPtr otherwise;
  SelectPtr select;

  Expression();
  ~Expression();
  explicit Expression(Kind kind, std::size_t position = 0);
};

struct SelectItem {
  ExpressionPtr expression;
  std::optional<String> alias;
};

struct TableSource {
  enum class Kind { table, derived, join };
  // product is what a comma of a from list means where it has to stand beside joins: printed as a cross join.
  enum class Join { inner, left, right, full, cross, product };

  Kind kind = Kind::table;
  ObjectName table;
  std::optional<String> alias;
  std::vector<String> hints;  // lower case: rowlock, xlock, readpast, ...
  SelectPtr derived;
  std::vector<String> columnNames;  // of a derived table: as x(a, b)
  Join join = Join::inner;
  std::unique_ptr<TableSource> left;
  std::unique_ptr<TableSource> right;
  ExpressionPtr on;
};
using TableSourcePtr = std::unique_ptr<TableSource>;

struct OrderItem {
  ExpressionPtr expression;
  bool descending = false;
};

// One select block: select ... from ... where ... group by ... having ...
struct SelectCore {
  bool distinct = false;
  std::optional<Token> top;  // an integer literal; -1 and the like come as the token's text with its sign
  bool topPercent = false;
  std::vector<SelectItem> items;
  std::vector<TableSourcePtr> from;
  ExpressionPtr where;
  std::vector<ExpressionPtr> groupBy;
  ExpressionPtr having;
};

// A query: a block and those that union adds, in order; then the order by of all.
struct Select {
  struct Part {
    bool all = false;  // how it is added to what stands before it; of no meaning for the first
    SelectCore core;
  };
  struct CommonTable {
    String name;
    std::vector<String> columns;
    SelectPtr select;
  };
  std::vector<CommonTable> with;
  std::vector<Part> parts;
  std::vector<OrderItem> orderBy;
};

struct Assignment {
  std::vector<String> qualifier;
  String column;
  ExpressionPtr value;
  std::size_t position = 0;
};

struct Insert {
  ObjectName table;
  std::vector<String> columns;                     // empty: all but the identity column
  std::vector<std::vector<ExpressionPtr>> values;  // rows; or
  SelectPtr select;
};

struct Update {
  ObjectName target;  // a table, or an alias of `from`
  std::vector<String> hints;
  std::vector<Assignment> assignments;
  std::vector<TableSourcePtr> from;
  ExpressionPtr where;
};

struct Delete {
  ObjectName target;
  std::vector<TableSourcePtr> from;
  ExpressionPtr where;
};

struct ColumnDefinition {
  String name;
  TypeName type;
  std::optional<bool> nullable;
  bool identity = false;
  std::int64_t seed = 1;
  std::int64_t increment = 1;
  ExpressionPtr defaultValue;
  bool primaryKey = false;
  bool unique = false;
};

struct KeyDefinition {
  String name;  // of the constraint; may be empty
  bool primary = false;
  std::vector<String> columns;
};

struct CreateTable {
  ObjectName table;
  std::vector<ColumnDefinition> columns;
  std::vector<KeyDefinition> keys;
};

struct CreateView {
  ObjectName view;
  std::vector<String> columns;
  SelectPtr select;
};

struct CreateIndex {
  String name;
  ObjectName table;
  std::vector<String> columns;
  bool unique = false;
};

struct CreateSynonym {
  ObjectName synonym;
  ObjectName target;
};

struct CreateLogin {
  String name;
  Token password;
};

struct AlterLogin {
  String name;
  Token password;
};

struct Drop {
  enum class Kind { table, view, index, synonym, login };
  Kind kind = Kind::table;
  ObjectName name;
  std::optional<ObjectName> table;  // of an index: drop index name on table
};

struct Use {
  String database;
};

// set nocount on, set identity_insert t on.
struct SetOption {
  String option;  // lower case
  std::optional<ObjectName> table;
  bool on = false;
};

struct Transaction {
  enum class Kind { begin, commit, rollback };
  Kind kind = Kind::begin;
};

// A procedure call: a name as the first word of a batch, or behind exec.
struct Call {
  ObjectName procedure;
  std::vector<ExpressionPtr> arguments;
};

// alter database name set single_user | multi_user [with no_wait]
struct AlterDatabase {
  String database;
  bool singleUser = false;
  bool noWait = false;
};

// backup database name to disk = 'file' with init
struct BackupDatabase {
  String database;
  Token file;
};

// restore database name from disk = 'file' with [move 'name' to 'file', ...] replace
struct RestoreDatabase {
  struct Move {
    Token name;
    Token file;
  };
  String database;
  Token file;
  std::vector<Move> moves;
};

// restore verifyonly from disk = 'file'
struct VerifyBackup {
  Token file;
};

using Statement = std::variant<SelectPtr, Insert, Update, Delete, CreateTable, CreateView, CreateIndex, CreateSynonym,
                               CreateLogin, AlterLogin, Drop, Use, SetOption, Transaction, Call, AlterDatabase,
                               BackupDatabase, RestoreDatabase, VerifyBackup>;

}  // namespace QVSa::tsql
