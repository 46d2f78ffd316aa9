#pragma once

#include "providers/Provider.h"

namespace QVSa::embedded {

// The engine in this process: data sources "file:" and the folder of an installation.
// open() throws 0x80004005 where there is no installation, 0x80040E4D for a refused log-in or an unknown database.
QVSa::Provider& provider();

}  // namespace QVSa::embedded
