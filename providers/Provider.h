#pragma once

#include <chrono>
#include <memory>
#include <utility>

#include "QVSa/values/Failure.h"
#include "QVSa/values/Values.h"
#include "QVSa/values/Variant.h"

namespace QVSa {

// A connection string taken apart.
struct ConnectionOptions {
  String provider;
  String dataSource;  // a host, "host,port", or "file:" and a folder
  String database;
  String user;
  String password;
  bool integrated = false;
  std::chrono::seconds loginTimeout{15};
};

struct Column {
  String name;            // empty for an unnamed column
  bool longData = false;  // a long text or binary column, read in chunks
};

// One result of a batch: a row set, or the count of rows that a statement wrote. A row set stands before its first row.
// Rows stay valid until they, or the session, are destroyed; running another batch does not invalidate them.
class Rows {
 public:
  virtual ~Rows() = default;
  // Empty for a result without a row set.
  virtual const std::vector<Column>& columns() const = 0;
  // Steps to the next row; false behind the last one.
  virtual bool next() = 0;
  // A value of the current row by its position from 0.
  virtual Variant value(std::size_t ordinal) const = 0;
  // Writes the given columns of the current row back to its table. Only for rows opened updatable.
  virtual void update(const std::vector<std::pair<std::size_t, Variant>>& changes) = 0;
};

struct Batch {
  String text;
  // A row set whose rows are fixed at opening and can be written back.
  bool updatable = false;
  std::chrono::seconds timeout{30};  // 0: no limit
};

struct BatchResult {
  std::unique_ptr<Rows> rows;  // the batch's first row set; empty where it has none
  Long affected = -1;          // rows written by the last counted statement; -1 where nothing was counted
};

// One connection to one server; Session is the name of a signed-on user's, in identity/. All members throw Failure.
// The destructor rolls back what is open and gives back everything the session held; it does not throw.
class ProviderSession {
 public:
  virtual ~ProviderSession() = default;
  // Runs every statement of the batch in order. Where it has a row set, the statements behind that one have run when
  // this returns.
  virtual BatchResult run(const Batch& batch) = 0;
  virtual void begin() = 0;
  virtual void commit() = 0;
  virtual void rollback() = 0;
};

// What stands behind a connection string.
class Provider {
 public:
  virtual ~Provider() = default;
  virtual std::unique_ptr<ProviderSession> open(const ConnectionOptions& options) = 0;
};

}  // namespace QVSa
