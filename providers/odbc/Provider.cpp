#include "providers/odbc/Provider.h"

#include <cstdlib>
#include <unistd.h>

#include "providers/ServerDriver.h"
#include "providers/odbc/Driver.h"
#include "providers/odbc/Session.h"

namespace QVSa::odbc {

namespace {

// With integrated security a connection is that of the account, and of the Kerberos ticket, that opened it.
String ownIdentity(const ConnectionOptions& options) {
  if (!options.integrated) return {};
  const char* ticket = std::getenv("KRB5CCNAME");
  return std::to_string(::geteuid()) + " " + (ticket == nullptr ? "" : ticket);
}

class OdbcProvider final : public Provider {
 public:
  std::unique_ptr<ProviderSession> open(const ConnectionOptions& options) override {
    const Access access = systemAccess();
    const String text = connectionText(options, access);
    return std::make_unique<Session>(Target{text, databaseText(options.database, access.driver), options.database,
                                            options.password, options.loginTimeout, access.keep,
                                            text + ownIdentity(options)});
  }
};

}  // namespace

Provider& provider() {
  // Never destroyed: a host may call with its last statics.
  static auto& instance = *new OdbcProvider();
  return instance;
}

String serverDriver() { return systemAccess().driver.name; }

}  // namespace QVSa::odbc
