#include "providers/embedded/storage/Pool.h"

#include <atomic>
#include <mutex>
#include <unistd.h>

#include "providers/embedded/administration/Upgrade.h"

namespace QVSa::embedded {

namespace {

// The one idle handle of the process. Handles are closed outside the mutex: that can take a checkpoint.
// Itself it is never destroyed: a host may call with its last statics.
class Pool {
 public:
  // The idle handle if it is one of this folder; an idle one of another folder stays.
  std::unique_ptr<Handle> take(const std::filesystem::path& folder) {
    const std::lock_guard guard(mutex_);
    return idle_ && idle_->folder().native() == folder.native() ? std::move(idle_) : nullptr;
  }

  // Keeps the handle; the one that was kept comes back, or this one at the end of the program.
  std::unique_ptr<Handle> keep(std::unique_ptr<Handle> handle) {
    const std::lock_guard guard(mutex_);
    if (!ended_) std::swap(idle_, handle);
    return handle;
  }

  // Nothing is kept from here on. The idle handle comes back.
  std::unique_ptr<Handle> end() {
    const std::lock_guard guard(mutex_);
    ended_ = true;
    return std::move(idle_);
  }

 private:
  std::mutex mutex_;
  std::unique_ptr<Handle> idle_;
  bool ended_ = false;
};

std::filesystem::path placeOf(const std::filesystem::path& folder) {
  return folder.is_absolute() ? folder : std::filesystem::absolute(folder);
}

// Checked before the mutex is touched, which another thread may have held at the moment of the fork.
bool isFirstProcess() {
  static std::atomic<pid_t> first = 0;
  pid_t none = 0;
  const pid_t self = ::getpid();
  return first.compare_exchange_strong(none, self) || none == self;
}

// Files that were closed need no recovery.
struct ClosedAtExit {
  explicit ClosedAtExit(Pool& closed) : pool(closed) {}
  ~ClosedAtExit() {
    if (isFirstProcess()) pool.end();
  }
  ClosedAtExit(const ClosedAtExit&) = delete;
  ClosedAtExit& operator=(const ClosedAtExit&) = delete;
  Pool& pool;
};

Pool& pool() {
  static Pool& thePool = *new Pool();
  static const ClosedAtExit closed(thePool);
  return thePool;
}

}  // namespace

void GiveBack::operator()(Handle* handle) const noexcept {
  std::unique_ptr<Handle> owned(handle);
  if (!isFirstProcess() || !owned->isUpToDate() || owned->replacesUnreadable()) return;
  try {
    owned->clear();
  } catch (...) {
    // A handle that cannot be cleared is closed, which ends all that it holds.
    return;
  }
  owned = pool().keep(std::move(owned));
}

PooledHandle acquireHandle(const std::filesystem::path& folder) {
  if (!isFirstProcess()) throw usedAfterFork();
  const std::filesystem::path place = placeOf(folder);
  if (auto idle = pool().take(place); idle && idle->isCurrent()) return PooledHandle(idle.release());
  if (PooledHandle handle(new Handle(place)); handle->isUpToDate()) return handle;
  upgradeInstallation(place);
  return PooledHandle(new Handle(place));
}

PooledHandle acquirePartialHandle(const std::filesystem::path& folder, const Failure& reason) {
  if (!isFirstProcess()) throw usedAfterFork();
  const std::filesystem::path place = placeOf(folder);
  const auto open = [&] { return PooledHandle(new Handle(place, Handle::Unreadable::replaced)); };
  PooledHandle handle = open();
  if (handle->isUpToDate()) return handle;
  // Where all files can be read, the upgrade is what has failed.
  std::optional<Failure> failure = reason;
  if (handle->hasReplaced()) {
    try {
      failure.reset();
      upgradeInstallation(place);
    } catch (const Failure& upgradeFailure) {
      failure.emplace(upgradeFailure);
    }
    handle = open();
  }
  if (failure) handle->replaceOutdated(*failure);
  return handle;
}

void discardIdleHandle(const std::filesystem::path& folder) { pool().take(placeOf(folder)); }

}  // namespace QVSa::embedded
