#include "providers/embedded/session/Workspace.h"

#include <algorithm>

#include "providers/embedded/session/Rows.h"
#include "providers/tsql/SqlFailure.h"

namespace QVSa::embedded {

Workspace::Workspace(PooledHandle handle, std::size_t database) : database_(database) {
  take(std::move(handle));
  enter(database_);
  refreshCatalogue();
  catalogue()->requireReadable(database_);
}

void Workspace::closeRows() {
  for (auto* rows : rows_) rows->close();
}

void Workspace::take(PooledHandle handle) {
  handle_ = std::move(handle);
  if (!handle_->attachment()) handle_->attachment() = std::make_shared<Cache>();
  cache_ = std::static_pointer_cast<Cache>(handle_->attachment());
}

void Workspace::reopen() {
  bufferRows();
  PooledHandle fresh(new Handle(handle_->folder(), Handle::Unreadable::replaced));
  fresh->adoptLocks(*handle_);
  retired_ = std::move(handle_);
  take(std::move(fresh));
}

void Workspace::refreshCatalogue() {
  const std::uint64_t mark = handle_->mark().value();
  if (cache_->catalogue && cache_->mark == mark && CatalogueMark::isSettled(mark)) return;
  // Who reads already goes on seeing what was there before: the mark says nothing of that.
  const bool readsAlready = sqlite3_txn_state(handle_->get(), nullptr) != SQLITE_TXN_NONE;
  if (!cache_->catalogue || cache_->catalogue->version() != handle_->catalogueVersion()) {
    for (auto& plans : cache_->plans) plans.clear();
    cache_->catalogue = std::make_shared<const Catalogue>(*handle_);
  }
  if (!readsAlready) cache_->mark = mark;
}

void Workspace::bufferRows() {
  for (auto* rows : rows_) rows->buffer();
}

void Workspace::use(std::size_t database) {
  enter(database);
  database_ = database;
}

void Workspace::enter(std::size_t database) {
  if (entered_.contains(database)) return;
  RowLocks& locks = handle_->locks(database);
  entered_.insert(database);
  if (locks.tryEnter()) return;
  entered_.erase(database);
  throw tsql::sqlFailure(924, std::string("Database '") + databaseNames[database] +
                                  "' is already open and can only have one user at a time.");
}

void Workspace::leaveOthers() {
  if (entered_.size() == 1) return;
  if (std::ranges::any_of(rows_, [](const EmbeddedRows* rows) { return rows->isStreaming(); })) return;
  std::erase_if(entered_, [this](std::size_t database) {
    if (database == database_) return false;
    handle_->locks(database).leave();
    return true;
  });
}

}  // namespace QVSa::embedded
