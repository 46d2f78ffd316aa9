#include "providers/tsql/Deadline.h"

#include "providers/tsql/SqlFailure.h"

namespace QVSa::tsql {

void Deadline::look() const {
  if (moment_ && std::chrono::steady_clock::now() >= *moment_) throw timeExpired();
}

}  // namespace QVSa::tsql
