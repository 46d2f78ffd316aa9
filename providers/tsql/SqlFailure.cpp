#include "providers/tsql/SqlFailure.h"

namespace QVSa::tsql {

Failure sqlFailure(Long native, const String& description) {
  return Failure(failureNumber(native), "SQL Server", description, native);
}

Long failureNumber(Long native) {
  switch (native) {
    case 515:
    case 2601:
    case 2627:
      return number::integrity;
    case 208:
      return number::noTable;
    case 241:
    case 242:
    case 245:
    case 295:
    case 8114:
      return number::conversion;
    case 220:
    case 244:
    case 248:
    case 296:
    case 2628:
    case 8115:
    case 8152:
      return number::range;
    case 229:
      return number::permission;
    case 4060:
    case 18456:
      return number::login;
    case 0:
    case 17:
    case 823:
    case 824:
    case 1205:
      return number::general;
    default:
      return number::statement;
  }
}

Failure timeExpired() { return Failure(number::timeout, "SQL Server", "Timeout expired"); }

Failure transactionLost() {
  return sqlFailure(3930,
                    "The current transaction cannot be committed and cannot support operations that write to the log "
                    "file. Roll back the transaction.");
}

Failure rowGone() {
  return Failure(number::general, "SQL Server",
                 "Row cannot be located for updating. Some values may have been changed since it was last read.");
}

void refuseDepth() {
  throw sqlFailure(
      191,
      "Some part of your SQL statement is nested too deeply. Rewrite the query or break it up into smaller "
      "queries.");
}

}  // namespace QVSa::tsql
