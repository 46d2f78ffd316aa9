#pragma once

#include <array>
#include <cstdint>
#include <memory>
#include <set>
#include <vector>

#include "providers/embedded/session/Plan.h"
#include "providers/embedded/storage/Pool.h"

namespace QVSa::embedded {

class EmbeddedRows;

// What the parts of a session share: its handle with the catalogue and the plans that are kept with it, its row sets,
// and the databases that it uses.
class Workspace {
 public:
  // Throws 924 where somebody else has the database alone, 4060 where it can't be read.
  Workspace(PooledHandle handle, std::size_t database);
  Workspace(const Workspace&) = delete;
  Workspace& operator=(const Workspace&) = delete;

  Handle& handle() const { return *handle_; }
  // Takes a new handle on the same files, in which a database that could not be read has got a new file.
  void reopen();

  const std::shared_ptr<const Catalogue>& catalogue() const { return cache_->catalogue; }
  void refreshCatalogue();
  void forgetCatalogue() { cache_->catalogue.reset(); }
  // The plans for the current database.
  PlanCache& plans(bool updatable) { return cache_->plans[2 * database_ + (updatable ? 1 : 0)]; }

  void attach(EmbeddedRows& rows) { rows_.push_back(&rows); }
  void detach(EmbeddedRows& rows) { std::erase(rows_, &rows); }
  // The session ends: what is left of its row sets is gone.
  void closeRows();
  // Reads all row sets to their end, so that the handle is free for a write.
  void bufferRows();

  // The current database.
  std::size_t database() const { return database_; }
  void use(std::size_t database);
  // Tells others that this session uses a database. Throws 924 where somebody has it alone.
  void enter(std::size_t database);
  // Leaves all databases but the current one, unless a row set still streams. Not within a transaction.
  void leaveOthers();

 private:
  // What a handle keeps between sessions.
  struct Cache {
    std::shared_ptr<const Catalogue> catalogue;
    std::uint64_t mark = 0;                                 // under which the catalogue was found right
    std::array<PlanCache, 2 * databaseNames.size()> plans;  // by current database and whether rows are written back
  };

  void take(PooledHandle handle);

  PooledHandle retired_;  // until the end of the session: a statement on its way knows it
  PooledHandle handle_;
  std::shared_ptr<Cache> cache_;
  std::size_t database_;
  std::vector<EmbeddedRows*> rows_;
  std::set<std::size_t> entered_;  // the current one always
};

}  // namespace QVSa::embedded
