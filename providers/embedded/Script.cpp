#include "providers/embedded/Script.h"

#include "providers/embedded/Definitions.h"
#include "providers/embedded/Pool.h"
#include "providers/embedded/Session.h"
#include "providers/tsql/Parser.h"

namespace QVSa::embedded {

void runScript(const std::filesystem::path& folder, const std::string& database, const std::string& script) {
  EmbeddedSession session(acquireHandle(folder), databaseByName(database).value(), true);
  for (const auto& batch : tsql::splitScript(script)) session.run({batch, false, std::chrono::seconds(0)});
}

}  // namespace QVSa::embedded
