#pragma once

#include <functional>

#include "providers/Provider.h"

namespace QVSa {

using SessionOpener = std::function<std::unique_ptr<ProviderSession>(const ConnectionOptions&)>;

// Opens a session for a parsed connection string: the embedded engine where the data source begins with "file:",
// SQL Server through ODBC otherwise.
std::unique_ptr<ProviderSession> openSession(const ConnectionOptions& options);

// Puts an opener between the library and its providers and returns the one that stood there. For a start-up or a test:
// not while another thread opens a connection.
SessionOpener interposeOpener(SessionOpener opener);

}  // namespace QVSa
