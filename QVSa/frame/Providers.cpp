#include "QVSa/frame/Providers.h"

#include "providers/embedded/Provider.h"
#include "providers/odbc/Provider.h"

namespace QVSa {

namespace {

constexpr const char* folderMark = "file:";

std::unique_ptr<ProviderSession> pick(const ConnectionOptions& options) {
  if (options.dataSource.rfind(folderMark, 0) != 0) return odbc::provider().open(options);
  // Both marks have a meaning of their own on the way from a server text to here.
  if (options.dataSource.find_first_of(";|") != String::npos)
    throw Failure(number::general, "Connection", "The folder of a data source must hold neither \";\" nor \"|\".");
  return embedded::provider().open(options);
}

SessionOpener& current() {
  static SessionOpener opener = pick;
  return opener;
}

}  // namespace

std::unique_ptr<ProviderSession> openSession(const ConnectionOptions& options) { return current()(options); }

SessionOpener interposeOpener(SessionOpener opener) { return std::exchange(current(), std::move(opener)); }

}  // namespace QVSa
