#pragma once

#include "providers/embedded/administration/BackupFile.h"
#include "providers/embedded/storage/Handle.h"

namespace QVSa::embedded {

// Replaces a database by the copy in a file, in one transaction: whoever reads, and a crash at any moment, finds the
// old database or the new one. The copy is checked first. A database that cannot be read gets a new file. Nobody may
// use the database meanwhile: who calls this has it alone. Throws as BackupFile does, 3234 for a copy of another
// database, 3013 where the database cannot be written, the time-out behind the handle's deadline.
void restoreCopy(const Handle& handle, std::size_t database, const String& path);

}  // namespace QVSa::embedded
