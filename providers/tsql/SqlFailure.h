#pragma once

#include "QVSa/values/Failure.h"

namespace QVSa::tsql {

// A statement failure by SQL Server's number: the number that callers see follows from it. `description` is the whole
// text.
Failure sqlFailure(Long native, const String& description);

// The failure number for SQL Server's own: integrity for 2627, 2601 and 515, no table for 208, and so on; `statement`
// for every other statement error.
Long failureNumber(Long native);

// A statement, or a wait of it, ran over its time-out.
Failure timeExpired();

// 191: what is nested deeper than whoever reads it has room for.
[[noreturn]] void refuseDepth();
// A row set's row that is to be written is not there any more.
Failure rowGone();
// 3930: the server has rolled the transaction back, and the session has not said so yet: whatever it wrote now would be
// committed alone.
Failure transactionLost();

}  // namespace QVSa::tsql
