#pragma once

#include "providers/embedded/administration/BackupFile.h"
#include "providers/embedded/storage/Handle.h"

namespace QVSa::embedded {

// Writes one consistent state of a database to a file, beside its place first, and puts it there in one step: what the
// file held before is whole until then. Users of the database go on working. Throws 3201 where the file cannot be made
// or replaced, is written by another backup at the moment, or is one of the installation's own; 3013 where it cannot be
// written, the time-out behind the handle's deadline.
void backUp(const Handle& handle, std::size_t database, const String& path);

}  // namespace QVSa::embedded
