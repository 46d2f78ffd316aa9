#include "QVSa/frame/internal/Providers.h"

#include "QVSa/frame/ConnectionString.h"
#include "providers/embedded/session/Provider.h"
#include "providers/odbc/Provider.h"

namespace QVSa {

namespace {

std::unique_ptr<ProviderSession> pick(const ConnectionOptions& options) {
  if (!isFolder(options.dataSource)) return odbc::provider().open(options);
  // In a server text the password begins there.
  if (options.dataSource.find('|') != String::npos)
    throw Failure(number::general, "Connection", "The folder of a data source must not hold \"|\".");
  return embedded::provider().open(options);
}

// Never destroyed: a host may call with its last statics.
SessionOpener& current() {
  static SessionOpener& opener = *new SessionOpener(pick);
  return opener;
}

}  // namespace

std::unique_ptr<ProviderSession> openSession(const ConnectionOptions& options) { return current()(options); }

SessionOpener interposeOpener(SessionOpener opener) { return std::exchange(current(), std::move(opener)); }

}  // namespace QVSa
