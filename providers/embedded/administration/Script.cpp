#include "providers/embedded/administration/Script.h"

#include "providers/embedded/session/Session.h"
#include "providers/embedded/storage/Definitions.h"
#include "providers/embedded/storage/Pool.h"
#include "providers/tsql/Parser.h"

namespace QVSa::embedded {

void runScript(const std::filesystem::path& folder, const std::string& database, const std::string& script) {
  EmbeddedSession session(acquireHandle(folder), databaseByName(database).value(), true);
  for (const auto& batch : tsql::splitScript(script)) session.run({batch, false, std::chrono::seconds(0)});
}

}  // namespace QVSa::embedded
