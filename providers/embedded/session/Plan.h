#pragma once

#include <map>
#include <memory>
#include <unordered_map>

#include "providers/Provider.h"
#include "providers/embedded/bind/Bound.h"
#include "providers/embedded/bind/Emitter.h"
#include "providers/embedded/storage/Handle.h"
#include "providers/tsql/Tree.h"

namespace QVSa::embedded {

// An SQLite statement, compiled at its first use and kept compiled.
class Compiled {
 public:
  explicit Compiled(Emitted emitted) : emitted_(std::move(emitted)) {}

  // A statement for one run. Two runs at once have two of them.
  Prepared take(Handle& handle);
  void giveBack(Prepared statement) noexcept;
  const std::string& text() const { return emitted_.text; }
  // The parameters that the text takes, by their place in the step's list, in the order of its numbers.
  const std::vector<std::size_t>& parameters() const { return emitted_.parameters; }
  // The databases that the text names.
  const std::vector<std::size_t>& databases() const { return emitted_.databases; }

 private:
  Emitted emitted_;
  std::vector<Prepared> idle_;
};

struct ResultColumn {
  Type type;
  std::optional<std::size_t> tableColumn;
};

// One statement of a batch, ready to run.
struct Step {
  enum class Kind { query, insert, write, control };

  Kind kind = Kind::control;
  std::unique_ptr<Compiled> main;
  // Keys of the rows that a select with lock hints may give, and of those that have a key of a row to insert.
  std::unique_ptr<Compiled> candidates;
  std::vector<std::size_t> databases;  // that `main` reads and writes
  std::vector<Parameter> parameters;
  std::vector<Column> columns;
  std::vector<ResultColumn> results;
  const TableInfo* table = nullptr;  // that is written, claimed or updatable
  bool locks = false;                // xlock
  bool skips = false;                // readpast
  bool givesIdentity = false;
  bool updatable = false;              // the row's key stands behind the last column
  tsql::Statement control;             // of kind control: run as it is
  std::optional<tsql::Update> update;  // of an update: needed again where its rows exchange their keys
};

// What a batch of one shape runs, with the catalogue that it was bound against.
struct Plan {
  std::shared_ptr<const Catalogue> catalogue;
  std::vector<Step> steps;
};

// What the compiled text rests on, for each literal of the batch.
enum class LiteralUse : std::uint8_t {
  value,    // its value
  pattern,  // whether it begins with a plain text
  none,     // any other value can take its place
};
using LiteralUses = std::vector<LiteralUse>;

// Compiles one statement. `uses` grows with the literals that are found to be used otherwise than by their value.
Step compile(tsql::Statement statement, const Catalogue& catalogue, std::size_t database, bool updatable,
             tsql::Deadline deadline, LiteralUses& uses);

// Plans by the shape of their batch and by those literals that the compiled text rests on.
class PlanCache {
 public:
  std::shared_ptr<Plan> find(const std::string& shape, const std::vector<tsql::Token>& tokens) const;
  void add(const std::string& shape, const std::vector<tsql::Token>& tokens, LiteralUses uses,
           std::shared_ptr<Plan> plan);
  void clear() { shapes_.clear(); }

 private:
  struct Shape {
    LiteralUses uses;
    std::map<std::string, std::shared_ptr<Plan>> plans;
  };
  static std::string variant(const LiteralUses& uses, const std::vector<tsql::Token>& tokens);

  std::unordered_map<std::string, Shape> shapes_;
  std::size_t size_ = 0;
};

}  // namespace QVSa::embedded
