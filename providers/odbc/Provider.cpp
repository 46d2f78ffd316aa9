#include "providers/odbc/Provider.h"

#include "providers/odbc/Driver.h"
#include "providers/odbc/Session.h"

namespace QVSa::odbc {

namespace {

class OdbcProvider final : public Provider {
 public:
  std::unique_ptr<ProviderSession> open(const ConnectionOptions& options) override {
    return std::make_unique<Session>(connectionText(options, systemDriver()), options.password, options.loginTimeout);
  }
};

}  // namespace

Provider& provider() {
  // Never destroyed: a host may call with its last statics.
  static auto& instance = *new OdbcProvider();
  return instance;
}

}  // namespace QVSa::odbc
