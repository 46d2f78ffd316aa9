#pragma once

#include <map>

#include "providers/embedded/bind/Bound.h"
#include "providers/tsql/Dialect.h"
#include "providers/tsql/Tree.h"

namespace QVSa::embedded {

// Finds every name of a statement in the catalogue, gives every expression its type and puts the dialect's own
// conversions in. Throws SQL Server's failures: 207 and 208 unknown names, 209 ambiguous, 4104 unknown qualifier, 8120
// column outside the group, 213 column count, and those of literals that do not convert.
// Literals become parameters of the emitted text; a literal that decides the text itself (a style, an ordinal, a size)
// does not, and so is part of the statement's shape.
class Binder {
 public:
  Binder(const Catalogue& catalogue, std::size_t currentDatabase, tsql::Deadline deadline = tsql::Deadline())
      : catalogue_(catalogue), database_(currentDatabase), deadline_(deadline) {}

  BoundQuery bindQuery(const tsql::Select& select, bool updatable);
  // Throws the failures of a query that no view can stand for as well.
  void checkView(const tsql::CreateView& view);
  // Throws the failures of a default that cannot be stored, if the column has one.
  void checkDefault(const ColumnInfo& column);
  BoundInsert bindInsert(const tsql::Insert& insert);
  BoundUpdate bindUpdate(const tsql::Update& update);
  BoundDelete bindDelete(const tsql::Delete& erase);
  // The keys of the rows that an update changes, each with its new values in the order of the assignments.
  BoundSelectPtr bindNewValues(const tsql::Update& update);

  std::vector<Parameter> takeParameters() { return std::move(parameters_); }
  // Literals that are patterns of an index range: whether they begin with a plain text is part of the shape.
  std::vector<std::size_t> takePatterns() { return std::move(patterns_); }

 private:
  struct SourceColumn {
    std::string name;
    std::string emitted;
    Type type;
    bool collated = false;
    std::optional<std::size_t> tableColumn;
  };
  struct ScopeSource {
    std::string name;   // as columns are qualified by it
    std::string alias;  // in the emitted text
    std::vector<SourceColumn> columns;
    const TableInfo* table = nullptr;
    // The database in which it stands by its own name, as in "database.owner.table.column".
    std::optional<std::size_t> database;
  };
  struct Scope {
    std::vector<ScopeSource> sources;
    const Scope* outer = nullptr;
  };
  struct CommonTable {
    std::string name;
    std::string emitted;
    std::vector<SourceColumn> columns;
    std::size_t tables = 1;  // that it reads
    // While its own body is bound, which may read it:
    bool isOpen = false;
    std::size_t depth = 0;  // of selects around the body
    std::size_t reads = 0;  // by the part that is bound now
  };
  struct Found {
    const ScopeSource* source;
    const SourceColumn* column;
  };

  // BindSelect.cpp
  BoundSelectPtr bindSelect(const tsql::Select& select, const Scope* outer);
  // A select inside another statement: ordered only where the order decides which rows there are.
  BoundSelectPtr bindInner(const tsql::Select& select, const Scope* outer);
  BoundPtr bindSubquery(const tsql::Select& select, const Scope& scope);
  void bindCommonTables(const tsql::Select& select, BoundSelect& bound, const Scope* outer);
  BoundSelectPtr bindRecursion(const tsql::Select::CommonTable& table, const std::string& emitted, const Scope* outer);
  BoundCore bindCore(const tsql::SelectCore& core, Scope& scope);
  BoundPtr bindWhere(const tsql::Expression& where, const Scope& scope);
  void bindItems(const tsql::SelectCore& core, const Scope& scope, BoundCore& bound);
  void addStar(const tsql::Expression& star, const Scope& scope, BoundCore& bound);
  void checkGroup(const BoundCore& core, const Scope& scope);
  // Throws `number` for a column of the clause that the group does not give.
  void checkGrouped(const BoundExpression& expression, const BoundCore& core, const Scope& scope, Long number,
                    const std::string& clause);
  static bool isGrouped(const BoundCore& core);
  // Whether the expression itself reads a column, or one of this scope's own sources.
  static bool readsColumn(const BoundExpression& expression);
  static bool readsOwn(const BoundExpression& expression, const Scope& scope);
  static bool readsOutside(const BoundExpression& expression, const Scope& scope);
  bool sameExpression(const BoundExpression& first, const BoundExpression& second);
  void unifyParts(BoundSelect& select);
  void collateResult(BoundSelect& select);
  void bindOrder(const tsql::Select& select, BoundSelect& bound, const Scope& scope);
  static void addEntryOrder(BoundSelect& bound);
  std::optional<std::size_t> ordinalOf(const tsql::Expression& expression, const tsql::Select& select,
                                       const BoundCore& core) const;
  static std::vector<SourceColumn> resultColumns(const BoundSelect& select);

  // BindFrom.cpp
  void bindFrom(const std::vector<tsql::TableSourcePtr>& from, Scope& scope, BoundCore& core);
  void bindSource(const tsql::TableSource& source, Scope& scope, BoundCore& core);
  void bindJoin(const tsql::TableSource& join, Scope& scope, BoundCore& core);
  void bindTable(const tsql::TableSource& source, Scope& scope, BoundCore& core);
  void bindDerived(const tsql::TableSource& source, Scope& scope, BoundCore& core);
  BoundSelectPtr bindView(const ViewInfo& view);
  ScopeSource tableScope(const TableInfo& table, const std::string& name);
  CommonTable* commonTable(const tsql::ObjectName& name);
  void readRecursively(CommonTable& table);
  std::optional<std::size_t> databaseOf(const tsql::TableSource& source) const;
  static bool isNamed(const ScopeSource& source, const std::vector<String>& qualifier);
  static void nameColumns(BoundCore& core, const std::vector<String>& names, const std::string& table);
  static std::size_t tablesIn(const BoundSelect& select);
  static void addScope(Scope& scope, ScopeSource source);
  std::string newAlias() { return "s" + std::to_string(++aliases_); }

  // BindWrite.cpp
  const TableInfo& writeTarget(const tsql::ObjectName& target, const std::vector<tsql::TableSourcePtr>& from) const;
  // Brings the target and the from clause into scope; gives the target's place among the sources.
  std::size_t bindWriteScope(const tsql::ObjectName& target, const std::vector<tsql::TableSourcePtr>& from,
                             Scope& scope, BoundCore& core);
  BoundSelectPtr keysOf(const tsql::ObjectName& target, const std::vector<tsql::TableSourcePtr>& from,
                        const tsql::Expression* where);
  BoundPtr bindStored(const tsql::Expression& expression, const ColumnInfo& column, const Scope& scope);
  void addDefaults(BoundInsert& insert, std::size_t given);
  std::vector<std::size_t> insertColumns(const tsql::Insert& insert, const TableInfo& table) const;
  void storeItems(BoundSelect& select, const BoundInsert& insert);
  void requireIdentity(BoundInsert& insert);

  // BindExpression.cpp
  BoundPtr bind(const tsql::Expression& expression, const Scope& scope);
  void countNode();
  BoundPtr bindLiteral(const tsql::Expression& expression, bool negate);
  BoundPtr bindColumn(const tsql::Expression& expression, const Scope& scope);
  Found findColumn(const tsql::Expression& expression, const Scope& scope) const;
  BoundPtr bindComparison(const tsql::Expression& expression, const Scope& scope);
  BoundPtr bindLogical(const tsql::Expression& expression, const Scope& scope);
  BoundPtr bindBetween(const tsql::Expression& expression, const Scope& scope);
  BoundPtr bindLike(const tsql::Expression& expression, const Scope& scope);
  BoundPtr bindIn(const tsql::Expression& expression, const Scope& scope);
  BoundPtr bindInList(const tsql::Expression& expression, BoundPtr value);
  BoundPtr bindInSelect(const tsql::Expression& expression, BoundPtr value, const Scope& scope);
  BoundPtr bindCase(const tsql::Expression& expression, const Scope& scope);
  BoundPtr bindConvert(const tsql::Expression& expression, const Scope& scope);

  // BindOperator.cpp
  BoundPtr bindSign(const tsql::Expression& expression, const Scope& scope);
  BoundPtr bindChain(const tsql::Expression& expression, const Scope& scope);
  BoundPtr combine(char op, BoundPtr left, BoundPtr right);
  BoundPtr join(BoundPtr left, BoundPtr right);
  BoundPtr moveDate(char op, BoundPtr left, BoundPtr right);
  BoundPtr calculate(const tsql::Operation& row, BoundPtr left, BoundPtr right);
  BoundPtr scaleDecimals(char op, const Type& type, BoundPtr left, BoundPtr right);
  Type digitsOf(const BoundExpression& operand);

  // BindFunction.cpp
  BoundPtr bindFunction(const tsql::Expression& expression, const Scope& scope);
  BoundPtr bindAggregate(const tsql::Operation& row, const tsql::Expression& expression, const Scope& scope);
  BoundPtr bindNullIf(const tsql::Expression& expression, const Scope& scope);
  std::vector<BoundPtr> bindOperands(const tsql::Operation& row, const tsql::Expression& expression,
                                     const Scope& scope);
  // The operand as the table of the dialect wants it in that place. Throws 8116, or 8117 for an aggregate or operator.
  BoundPtr taken(const tsql::Operation& row, std::size_t place, BoundPtr operand);

  // BindConversion.cpp
  // `value` as a value of type `to`; unchanged where nothing has to be done.
  BoundPtr coerce(BoundPtr value, const Type& to, Purpose purpose, int style = 0);
  // Brings both to the type that the dialect compares them in, with the collation on texts.
  void alignForComparison(BoundPtr& left, BoundPtr& right);
  // The collation of the dialect, put on a text that does not have it by itself.
  static BoundPtr collate(BoundPtr value);
  BoundPtr parameter(const Parameter& value);
  Parameter literalParameter(const tsql::Token& token, Parameter::Source source) const;

  static BoundPtr call(const std::string& function, const Type& type, std::vector<BoundPtr> operands);
  static BoundPtr infix(const std::string& op, const Type& type, BoundPtr left, BoundPtr right);
  static BoundPtr constant(const std::string& text);
  static BoundPtr rowid(const std::string& alias);

  const Catalogue& catalogue_;
  std::size_t database_;
  tsql::Deadline deadline_;
  std::vector<Parameter> parameters_;
  std::vector<std::size_t> patterns_;
  std::vector<CommonTable> commonTables_;
  std::size_t aliases_ = 0;
  std::size_t nodes_ = 0;  // of the bound tree
  std::size_t viewDepth_ = 0;
  std::size_t selectDepth_ = 0;
  bool ownLiterals_ = false;
  bool stores_ = false;  // what is bound is written to a table
};

// Throws 116 where a select that stands for values gives several columns.
void requireOneColumn(const BoundSelect& select);

// 8623: the statement has more of something than it may.
[[noreturn]] void refuseSize();

}  // namespace QVSa::embedded
