#include "providers/embedded/session/Provider.h"

#include "providers/embedded/administration/Login.h"
#include "providers/embedded/session/Session.h"
#include "providers/embedded/storage/Catalogue.h"
#include "providers/embedded/storage/OpeningFailure.h"
#include "providers/embedded/storage/Pool.h"
#include "providers/tsql/SqlFailure.h"

namespace QVSa::embedded {

namespace {

constexpr const char* administrator = "sa";
constexpr Long inSingleUserMode = 924;

std::filesystem::path folderOf(const ConnectionOptions& options) {
  const std::string folder = options.dataSource.substr(std::string("file:").size());
  if (folder.empty())
    throw tsql::sqlFailure(17,
                           "SQL Server does not exist or access denied. The data source \"file:\" names no folder: "
                           "write the installation's behind it.");
  return folder;
}

std::unique_ptr<ProviderSession> sessionOn(PooledHandle handle, const ConnectionOptions& options) {
  handle->deadline(std::chrono::steady_clock::now() + options.loginTimeout);
  // Who may open the files with the process's own identity needs no password.
  if (!options.integrated) checkLogin(*handle, options.user, options.password);
  const auto database = databaseByName(options.database);
  if (!database)
    throw tsql::sqlFailure(cannotOpenDatabase, "Cannot open database \"" + options.database +
                                                   "\" requested by the login. The login failed.");
  const bool isAdministrator = options.integrated || sameName(options.user, administrator);
  try {
    Handle& opened = *handle;
    auto session = std::make_unique<EmbeddedSession>(std::move(handle), *database, isAdministrator);
    // The log-in is over, and its limit with it.
    opened.deadline(std::nullopt);
    return session;
  } catch (const Failure& failure) {
    if (failure.native() != inSingleUserMode) throw;
    throw tsql::sqlFailure(cannotOpenDatabase, "Cannot open database \"" + options.database +
                                                   "\" requested by the login. " + failure.description());
  }
}

class EmbeddedProvider : public QVSa::Provider {
 public:
  std::unique_ptr<ProviderSession> open(const ConnectionOptions& options) override {
    const std::filesystem::path folder = folderOf(options);
    try {
      return sessionOn(acquireHandle(folder), options);
    } catch (const Failure& failure) {
      if (failure.native() != cannotOpenDatabase) throw;
      // A database that cannot be read keeps nobody out of the others, nor its backup from getting in.
      return sessionOn(acquirePartialHandle(folder, failure), options);
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
