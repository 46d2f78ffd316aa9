#pragma once

#include <map>
#include <memory>
#include <unordered_map>

#include "QVSa/frame/Provider.h"
#include "providers/embedded/Bound.h"
#include "providers/embedded/Handle.h"
#include "providers/tsql/Tree.h"

namespace QVSa::embedded {

// A text of the storage library, compiled at its first use and kept compiled.
class Compiled {
 public:
  explicit Compiled(std::string text) : text_(std::move(text)) {}

  // A statement for one run. Two runs at once have two of them.
  Prepared take(Handle& handle);
  void giveBack(Prepared statement) noexcept;
  // The parameters that the text takes, by their place in the step's list.
  const std::vector<std::size_t>& parameters() const { return parameters_; }
  // The databases that the text names.
  std::vector<std::size_t> databases() const;

 private:
  std::string text_;
  std::vector<std::size_t> parameters_;
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
  std::unique_ptr<Compiled> candidates;  // keys of the rows that the statement is about
  std::vector<std::size_t> databases;    // that `main` reads and writes
  std::vector<Parameter> parameters;
  std::vector<Column> columns;
  std::vector<ResultColumn> results;
  const TableInfo* table = nullptr;  // that is written, claimed or updatable
  bool locks = false;                // xlock
  bool skips = false;                // readpast
  bool givesIdentity = false;
  bool updatable = false;   // the row's key stands behind the last column
  tsql::Statement control;  // of kind control: run as it is
};

// What a batch of one shape runs, with the catalogue that it was bound against.
struct Plan {
  std::shared_ptr<const Catalogue> catalogue;
  std::vector<Step> steps;
};

// Compiles one statement. `patterns` gets the literals whose form, and `values` those whose value, the text rests on.
struct ShapeFacts {
  std::vector<std::size_t> parameters;  // literals that any other value can take the place of
  std::vector<std::size_t> patterns;    // literals that count by whether they begin with a plain text
};
Step compile(tsql::Statement statement, const Catalogue& catalogue, std::size_t database, bool updatable,
             ShapeFacts& facts);

// Plans by the shape of their batch and by those literals that the compiled text rests on.
class PlanCache {
 public:
  std::shared_ptr<Plan> find(const std::string& shape, const std::vector<tsql::Token>& tokens) const;
  void add(const std::string& shape, const std::vector<tsql::Token>& tokens, const ShapeFacts& facts,
           std::shared_ptr<Plan> plan);
  void clear() { shapes_.clear(); }

 private:
  struct Shape {
    std::vector<std::size_t> values;
    std::vector<std::size_t> patterns;
    std::map<std::string, std::shared_ptr<Plan>> plans;
  };
  static std::string variant(const Shape& shape, const std::vector<tsql::Token>& tokens);

  std::unordered_map<std::string, Shape> shapes_;
  std::size_t size_ = 0;
};

}  // namespace QVSa::embedded
