// In place of the provider in a build without SQL Server.
#include "QVSa/values/Failure.h"
#include "providers/odbc/Provider.h"

namespace QVSa::odbc {

namespace {

class MissingProvider final : public Provider {
 public:
  std::unique_ptr<ProviderSession> open(const ConnectionOptions&) override {
    throw Failure(number::general, "Connection",
                  "This build connects to no SQL Server, only to the folder of an installation (file:).");
  }
};

}  // namespace

Provider& provider() {
  static auto& instance = *new MissingProvider();
  return instance;
}

}  // namespace QVSa::odbc
