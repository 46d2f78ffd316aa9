#pragma once

#include <memory>

#include "providers/embedded/storage/Handle.h"

namespace QVSa::embedded {

// Gives a handle back to the process's pool, cleared; one idle handle is kept, the last one given back.
struct GiveBack {
  void operator()(Handle* handle) const noexcept;
};

using PooledHandle = std::unique_ptr<Handle, GiveBack>;

// The idle handle of this folder, if its files are still the same, or a new one; an installation of an older layout is
// upgraded first. Throws as Handle and upgradeInstallation do, and 0x80004005 in a process that was forked from one
// that had used the engine. Threads may call it at once.
PooledHandle acquireHandle(const std::filesystem::path& folder);

// A new handle that replaces what cannot be read or upgraded, after acquireHandle has failed for a reason. It does not
// go into the pool.
PooledHandle acquirePartialHandle(const std::filesystem::path& folder, const Failure& reason);

// Closes the idle handle of the folder, before its files are moved or removed.
void discardIdleHandle(const std::filesystem::path& folder);

}  // namespace QVSa::embedded
