#include "providers/embedded/bind/Emitter.h"

#include <algorithm>
#include <set>
#include <unordered_map>

#include "providers/tsql/SqlFailure.h"

namespace QVSa::embedded {

namespace {

// SQLite's parser keeps what it has read of every construct that is not complete, in a stack of 100 places. A level of
// each construct costs these (measured; a name or a literal at the bottom needs up to five).
namespace places {
constexpr int most = 90;
constexpr int parenthesis = 1;
constexpr int prefix = 2;
constexpr int rightOperand = 3;
constexpr int firstArgument = 3;
constexpr int nextArgument = 5;
constexpr int firstWhen = 4;
constexpr int firstThen = 6;
constexpr int nextWhen = 5;
constexpr int nextThen = 7;
constexpr int otherwise = 5;
constexpr int low = 3;
constexpr int high = 5;
constexpr int inItem = 6;
constexpr int inSelect = 4;
constexpr int exists = 3;
constexpr int item = 4;
constexpr int derived = 6;
constexpr int on = 9;
constexpr int firstWhere = 5;
constexpr int nextWhere = 7;
constexpr int groupBy = 9;
constexpr int having = 7;
constexpr int orderBy = 11;
constexpr int unionPart = 2;
constexpr int commonTable = 8;
constexpr int tableOfValues = 11;
constexpr int behindWith = 3;
constexpr int values = 9;
constexpr int assignment = 10;
constexpr int updateFrom = 11;
constexpr int deleteFrom = 8;
}  // namespace places

// A chain is written as chains of so many links: SQLite keeps the depth of an expression below 1,000, and counts a flat
// chain as one level a link.
constexpr std::size_t linksInARow = 16;
// SQLite's functions take 127 operands at most.
constexpr std::size_t mostOperands = 100;

// Keys of a table, each by the places of its columns.
using Keys = std::vector<const std::vector<std::size_t>*>;

std::size_t placeIn(const BoundInsert& insert, std::size_t column) {
  return static_cast<std::size_t>(std::ranges::find(insert.columns, column) - insert.columns.begin());
}

bool isGiven(const BoundInsert& insert, std::size_t column) { return placeIn(insert, column) < insert.columns.size(); }

class Writer {
 public:
  void write(const BoundSelect& select);
  void write(const BoundInsert& insert);
  void writeTwins(const BoundInsert& insert, const Keys& keys);
  void write(const BoundUpdate& update);
  void write(const BoundDelete& erase);

  Emitted take() {
    numberParameters();
    emitted_.databases.assign(databases_.begin(), databases_.end());
    return std::move(emitted_);
  }

 private:
  // Takes places of the parser's stack while what is written inside is not complete.
  class Pending {
   public:
    Pending(Writer& writer, int count) : writer_(writer), count_(count) {
      if (writer_.pending_ + count_ > places::most) tsql::refuseDepth();
      writer_.pending_ += count_;
    }
    ~Pending() { writer_.pending_ -= count_; }
    Pending(const Pending&) = delete;
    Pending& operator=(const Pending&) = delete;

   private:
    Writer& writer_;
    int count_;
  };

  // A place of a parameter.
  struct Use {
    std::size_t end;  // of its "?" in the text
    std::size_t number;
  };

  void add(std::string_view text) { emitted_.text += text; }
  void addNumber(std::size_t number) { add(std::to_string(number)); }
  template <class Node>
  void inside(int count, const Node& node) {
    const Pending pending(*this, count);
    write(node);
  }
  template <class List, class Write>
  void list(const List& items, std::string_view between, Write writeOne) {
    bool first = true;
    for (const auto& item : items) {
      if (!first) add(between);
      first = false;
      writeOne(item);
    }
  }

  void write(const BoundExpression& expression);
  void writeParameter(std::size_t parameter);
  void numberParameters();
  void writeTable(const TableInfo& table);
  void writeRows(const BoundInsert& insert, int depth);
  void writeCall(const BoundExpression& call);
  void writeArguments(const BoundExpression& call, std::size_t begin, std::size_t end);
  void writeCalculation(const BoundExpression& call);
  void writeAssociative(const BoundExpression& call, std::size_t begin, std::size_t end);
  void writeInfix(const BoundExpression& chain, std::size_t begin, std::size_t end);
  void writeCase(const BoundExpression& choice);
  void writeIn(const BoundExpression& in);
  void write(const BoundCore& core);
  void writePart(const BoundCore& core, bool alone);
  void writeSource(const BoundSource& source);
  void writeFrom(const std::vector<BoundSource>& from);
  void writeWhere(const std::vector<BoundPtr>& where);
  void writeWith(const std::vector<BoundSelect::CommonTable>& with);
  void writeOrder(const std::vector<BoundOrder>& orderBy);

  Emitted emitted_;
  std::unordered_map<std::size_t, std::size_t> numbers_;  // of the parameters
  std::vector<Use> uses_;                                 // of all of them
  std::set<std::size_t> databases_;
  int pending_ = 0;
};

void Writer::writeParameter(std::size_t parameter) {
  const auto [number, isNew] = numbers_.try_emplace(parameter, numbers_.size() + 1);
  if (isNew) emitted_.parameters.push_back(parameter);
  add("?");
  uses_.push_back({emitted_.text.size(), number->second});
}

// SQLite looks for every number that is written through a list of all that are: only a parameter that stands in several
// places needs its own.
void Writer::numberParameters() {
  std::vector<std::size_t> times(emitted_.parameters.size() + 1);
  for (const Use& use : uses_) ++times[use.number];
  std::string numbered;
  std::size_t done = 0;
  for (const Use& use : uses_) {
    if (times[use.number] == 1) continue;
    numbered.append(emitted_.text, done, use.end - done).append(std::to_string(use.number));
    done = use.end;
  }
  emitted_.text = numbered.append(emitted_.text, done);
}

void Writer::writeTable(const TableInfo& table) {
  databases_.insert(table.database);
  add(databaseNames[table.database]);
  add(".");
  add(quoteName(table.name));
}

void Writer::write(const BoundExpression& expression) {
  using Kind = BoundExpression::Kind;
  switch (expression.kind) {
    case Kind::null:
      return add("null");
    case Kind::parameter:
      return writeParameter(expression.parameter);
    case Kind::column:
      add(expression.source);
      add(".");
      return add(expression.text);
    case Kind::rowid:
      add(expression.source);
      return add("._rowid_");
    case Kind::constant:
      return add(expression.text);
    case Kind::call:
      return writeCall(expression);
    case Kind::prefix:
      add("(");
      add(expression.text);
      add(" ");
      inside(places::prefix, *expression.operands[0]);
      return add(")");
    case Kind::infix:
      return writeInfix(expression, 0, expression.operands.size());
    case Kind::isNull:
      add("(");
      inside(places::parenthesis, *expression.operands[0]);
      return add(expression.negated ? " is not null)" : " is null)");
    case Kind::between:
      add("(");
      inside(places::parenthesis, *expression.operands[0]);
      add(expression.negated ? " not between " : " between ");
      inside(places::low, *expression.operands[1]);
      add(" and ");
      inside(places::high, *expression.operands[2]);
      return add(")");
    case Kind::caseOf:
      return writeCase(expression);
    case Kind::inValues:
    case Kind::inList:
    case Kind::inSelect:
      return writeIn(expression);
    case Kind::exists:
      add("(exists (");
      inside(places::exists, *expression.select);
      return add("))");
    case Kind::subquery:
      add("(");
      inside(places::parenthesis, *expression.select);
      return add(")");
  }
}

void Writer::writeCall(const BoundExpression& call) {
  if (call.operands.size() <= mostOperands) return writeArguments(call, 0, call.operands.size());
  if (call.text == "t_calculate") return writeCalculation(call);
  writeAssociative(call, 0, call.operands.size());
}

void Writer::writeArguments(const BoundExpression& call, std::size_t begin, std::size_t end) {
  add(call.text);
  add("(");
  if (call.distinct) add("distinct ");
  for (std::size_t i = begin; i < end; ++i) {
    if (i > begin) add(",");
    inside(i == begin ? places::firstArgument : places::nextArgument, *call.operands[i]);
  }
  add(")");
}

// Numbers are added up from left to right, so that a long chain cannot be cut into calls of its parts: its operands go
// in packs.
void Writer::writeCalculation(const BoundExpression& call) {
  const std::size_t count = call.operands.size() - 1;
  const std::string& form = call.operands.back()->text;
  const Pending pending(*this, places::nextArgument);
  add("t_calculate(");
  for (std::size_t begin = 0; begin < count; begin += mostOperands) {
    add("t_pack(");
    for (std::size_t i = begin; i < std::min(begin + mostOperands, count); ++i) {
      inside(places::nextArgument, *call.operands[i]);
      add(",");
    }
    add(form);
    add("),");
  }
  // In capitals, the kind of number says that the operands lie in packs.
  std::string packed = form;
  packed[1] = static_cast<char>(packed[1] - ('a' - 'A'));
  add(packed);
  add(")");
}

// Of coalesce: whoever takes the first of all takes the first of the firsts of its parts.
void Writer::writeAssociative(const BoundExpression& call, std::size_t begin, std::size_t end) {
  std::size_t part = 1;
  while (part * mostOperands < end - begin) part *= mostOperands;
  if (part == 1) return writeArguments(call, begin, end);
  const Pending pending(*this, places::nextArgument);
  add(call.text);
  add("(");
  for (std::size_t at = begin; at < end; at += part) {
    if (at > begin) add(",");
    if (end - at == 1)
      write(*call.operands[at]);
    else
      writeAssociative(call, at, std::min(at + part, end));
  }
  add(")");
}

void Writer::writeInfix(const BoundExpression& chain, std::size_t begin, std::size_t end) {
  if (end - begin == 1) return write(*chain.operands[begin]);
  std::size_t part = 1;
  while (part * linksInARow < end - begin) part *= linksInARow;
  add("(");
  for (std::size_t at = begin; at < end; at += part) {
    if (at > begin) {
      add(" ");
      add(chain.text);
      add(" ");
    }
    const Pending pending(*this, at == begin ? places::parenthesis : places::rightOperand);
    writeInfix(chain, at, std::min(at + part, end));
  }
  add(")");
}

void Writer::writeCase(const BoundExpression& choice) {
  const std::size_t paired = choice.operands.size() / 2 * 2;
  add("(case");
  for (std::size_t i = 0; i < paired; i += 2) {
    add(" when ");
    inside(i == 0 ? places::firstWhen : places::nextWhen, *choice.operands[i]);
    add(" then ");
    inside(i == 0 ? places::firstThen : places::nextThen, *choice.operands[i + 1]);
  }
  if (paired < choice.operands.size()) {
    add(" else ");
    inside(places::otherwise, *choice.operands.back());
  }
  add(" end)");
}

void Writer::writeIn(const BoundExpression& in) {
  add("(");
  inside(places::parenthesis, *in.operands[0]);
  add(in.negated ? " not in (" : " in (");
  if (in.kind == BoundExpression::Kind::inSelect) {
    inside(places::inSelect, *in.select);
  } else if (in.kind == BoundExpression::Kind::inList) {
    add("select value from list(");
    writeParameter(in.parameter);
    add(")");
  } else {
    for (std::size_t i = 1; i < in.operands.size(); ++i) {
      if (i > 1) add(",");
      inside(places::inItem, *in.operands[i]);
    }
  }
  add("))");
}

void Writer::writeSource(const BoundSource& source) {
  if (source.table) {
    writeTable(*source.table);
  } else if (source.derived) {
    add("(");
    inside(places::derived, *source.derived);
    add(")");
  } else {
    add(source.commonTable);
  }
  add(" as ");
  add(source.alias);
  if (!source.leftJoin) return;
  add(" on ");
  inside(places::on, *source.on);
}

void Writer::writeFrom(const std::vector<BoundSource>& from) {
  for (const auto& source : from) {
    if (&source != &from.front()) add(source.leftJoin ? " left join " : source.crossJoin ? " cross join " : ",");
    writeSource(source);
  }
}

void Writer::writeWhere(const std::vector<BoundPtr>& where) {
  if (where.empty()) return;
  add(" where ");
  list(where, " and ", [&](const BoundPtr& condition) {
    inside(&condition == &where.front() ? places::firstWhere : places::nextWhere, *condition);
  });
}

void Writer::write(const BoundCore& core) {
  add(core.distinct ? "select distinct " : "select ");
  std::size_t column = 0;
  list(core.items, ",", [&](const BoundItem& item) {
    inside(places::item, *item.expression);
    add(" as c");
    addNumber(column++);
  });
  if (!core.from.empty()) add(" from ");
  writeFrom(core.from);
  writeWhere(core.where);
  if (!core.groupBy.empty()) add(" group by ");
  list(core.groupBy, ",", [&](const BoundPtr& key) { inside(places::groupBy, *key); });
  if (!core.having) return;
  add(core.groupBy.empty() ? " group by null having " : " having ");
  inside(places::having, *core.having);
}

// A limit of one part of a union stands inside it, that of a single block behind its order.
void Writer::writePart(const BoundCore& core, bool alone) {
  if (alone || !core.top) return write(core);
  add("select * from (");
  inside(places::derived, core);
  add(" limit ");
  writeParameter(*core.top);
  add(")");
}

void Writer::writeWith(const std::vector<BoundSelect::CommonTable>& with) {
  if (with.empty()) return;
  add("with recursive ");
  list(with, ",", [&](const BoundSelect::CommonTable& table) {
    add(table.name);
    for (std::size_t i = 0; i < table.columns; ++i) {
      add(i == 0 ? "(c" : ",c");
      addNumber(i);
    }
    add(") as (");
    inside(places::commonTable, *table.select);
    add(")");
  });
  add(" ");
}

void Writer::writeOrder(const std::vector<BoundOrder>& orderBy) {
  if (orderBy.empty()) return;
  add(" order by ");
  list(orderBy, ",", [&](const BoundOrder& order) {
    if (order.expression)
      inside(places::orderBy, *order.expression);
    else
      addNumber(order.ordinal);
    if (order.descending) add(" desc");
  });
}

void Writer::write(const BoundSelect& select) {
  writeWith(select.with);
  const Pending behindWith(*this, select.with.empty() ? 0 : places::behindWith);
  const bool alone = select.parts.size() == 1;
  const Pending part(*this, alone ? 0 : places::unionPart);
  for (const auto& one : select.parts) {
    if (&one != &select.parts.front()) add(one.all ? " union all " : " union ");
    writePart(one.core, alone);
  }
  writeOrder(select.orderBy);
  if (!alone || !select.parts.front().core.top) return;
  add(" limit ");
  writeParameter(*select.parts.front().core.top);
}

void Writer::write(const BoundInsert& insert) {
  add("insert into ");
  writeTable(*insert.table);
  add("(");
  list(insert.columns, ",", [&](std::size_t column) { add(quoteName(insert.table->columns[column].name)); });
  add(") ");
  writeRows(insert, places::values);
}

void Writer::writeRows(const BoundInsert& insert, int depth) {
  if (insert.select) return inside(depth, *insert.select);
  add("values ");
  list(insert.rows, ",", [&](const std::vector<BoundPtr>& row) {
    add("(");
    list(row, ",", [&](const BoundPtr& value) { inside(depth, *value); });
    add(")");
  });
}

void Writer::writeTwins(const BoundInsert& insert, const Keys& keys) {
  add("with n");
  for (std::size_t i = 0; i < insert.columns.size(); ++i) {
    add(i == 0 ? "(c" : ",c");
    addNumber(i);
  }
  add(") as (");
  writeRows(insert, places::tableOfValues);
  add(") select t._rowid_ from n,");
  writeTable(*insert.table);
  add(" as t where ");
  list(keys, " or ", [&](const auto* key) {
    add("(");
    list(*key, " and ", [&](std::size_t column) {
      add("t." + quoteName(insert.table->columns[column].name) + "=n.c");
      addNumber(placeIn(insert, column));
    });
    add(")");
  });
}

void Writer::write(const BoundUpdate& update) {
  add("update ");
  writeTable(*update.table);
  add(" as ");
  add(update.alias);
  add(" set ");
  std::size_t value = 0;
  list(update.assignments, ",", [&](const auto& assignment) {
    add(quoteName(update.table->columns[assignment.first].name));
    add("=");
    if (!update.from) return inside(places::assignment, *assignment.second);
    add("n.c");
    addNumber(++value);
  });
  if (!update.from) return writeWhere(update.where);
  add(" from (");
  inside(places::updateFrom, *update.from);
  add(") as n where ");
  add(update.alias);
  add("._rowid_=n.c0");
}

void Writer::write(const BoundDelete& erase) {
  add("delete from ");
  writeTable(*erase.table);
  if (!erase.from) {
    add(" as ");
    add(erase.alias);
    return writeWhere(erase.where);
  }
  add(" where _rowid_ in (");
  inside(places::deleteFrom, *erase.from);
  add(")");
}

template <class Statement>
Emitted emitted(const Statement& statement) {
  Writer writer;
  writer.write(statement);
  return writer.take();
}

}  // namespace

Emitted emit(const BoundSelect& select) { return emitted(select); }
Emitted emit(const BoundInsert& insert) { return emitted(insert); }
Emitted emit(const BoundUpdate& update) { return emitted(update); }
Emitted emit(const BoundDelete& erase) { return emitted(erase); }

std::optional<Emitted> emitTwins(const BoundInsert& insert) {
  Keys keys;
  for (const auto& key : insert.table->keys)
    if (std::ranges::all_of(key, [&](std::size_t column) { return isGiven(insert, column); })) keys.push_back(&key);
  if (keys.empty()) return std::nullopt;
  Writer writer;
  writer.writeTwins(insert, keys);
  return writer.take();
}

}  // namespace QVSa::embedded
