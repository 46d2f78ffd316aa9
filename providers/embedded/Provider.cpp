#include "providers/embedded/Provider.h"

#include "providers/embedded/Catalogue.h"
#include "providers/embedded/Login.h"
#include "providers/embedded/Pool.h"
#include "providers/embedded/Session.h"
#include "providers/tsql/SqlFailure.h"

namespace QVSa::embedded {

namespace {

constexpr const char* administrator = "sa";
constexpr Long inSingleUserMode = 924;

class EmbeddedProvider : public QVSa::Provider {
 public:
  std::unique_ptr<ProviderSession> open(const ConnectionOptions& options) override {
    PooledHandle handle = acquireHandle(options.dataSource.substr(std::string("file:").size()));
    handle->deadline(std::chrono::steady_clock::now() + options.loginTimeout);
    // Who may open the files with the process's own identity needs no password.
    if (!options.integrated) checkLogin(*handle, options.user, options.password);
    const auto database = databaseByName(options.database);
    if (!database)
      throw tsql::sqlFailure(4060, "Cannot open database \"" + options.database +
                                       "\" requested by the login. The login "
                                       "failed.");
    const bool isAdministrator = options.integrated || sameName(options.user, administrator);
    try {
      Handle& opened = *handle;
      auto session = std::make_unique<EmbeddedSession>(std::move(handle), *database, isAdministrator);
      // The log-in is over, and its limit with it.
      opened.deadline(std::nullopt);
      return session;
    } catch (const Failure& failure) {
      if (failure.native() != inSingleUserMode) throw;
      throw tsql::sqlFailure(
          4060, "Cannot open database \"" + options.database + "\" requested by the login. " + failure.description());
    }
  }
};

}  // namespace

QVSa::Provider& provider() {
  // Never destroyed: a host may call with its last statics.
  static auto& theProvider = *new EmbeddedProvider();
  return theProvider;
}

}  // namespace QVSa::embedded
