// In place of the provider in a build without SQL Server.
#include "QVSa/values/Failure.h"
#include "providers/ServerDriver.h"
#include "providers/odbc/Provider.h"

namespace QVSa::odbc {

namespace {

[[noreturn]] void refuse() {
  throw Failure(number::general, "Connection",
                "This build connects to no SQL Server, only to the folder of an installation (file:).");
}

class MissingProvider final : public Provider {
 public:
  std::unique_ptr<ProviderSession> open(const ConnectionOptions&) override { refuse(); }
};

}  // namespace

Provider& provider() {
  static auto& instance = *new MissingProvider();
  return instance;
}

String serverDriver() { refuse(); }

}  // namespace QVSa::odbc
