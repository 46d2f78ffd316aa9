#include "providers/embedded/administration/Upgrade.h"

#include "database/Scripts.h"
#include "providers/embedded/session/Session.h"
#include "providers/embedded/storage/OpeningFailure.h"
#include "providers/tsql/Parser.h"

namespace QVSa::embedded {

namespace {

constexpr std::chrono::seconds waitForOthers{15};

struct LayoutStep {
  int layout;  // that the database has after it
  std::string_view database;
  std::string_view script;
};

// In the order of the layouts. Where a layout has no step for a database, nothing but its number changes.
std::array<LayoutStep, 1> steps() { return {{{2, "QVSys", database::qvSys2}}}; }

void takeAlone(Handle& handle, std::size_t database) {
  handle.deadline(std::chrono::steady_clock::now() + waitForOthers);
  while (!handle.locks(database).tryTakeAlone()) {
    try {
      handle.waitShortly();
    } catch (const Failure&) {
      throw cannotOpen(handle.folder(), database,
                       "the file is of an older release and can't be upgraded while it is in use",
                       "End the programs that use it.");
    }
  }
  handle.deadline(std::nullopt);
}

void upgradeDatabase(const std::filesystem::path& folder, std::size_t database) {
  PooledHandle handle(new Handle(folder, Handle::Unreadable::replaced));
  if (handle->layout(database) == layoutVersion) return;
  takeAlone(*handle, database);
  EmbeddedSession(std::move(handle), database, true).upgrade(database);
}

}  // namespace

std::vector<std::string> upgradeBatches(const std::string& database, int layout) {
  std::vector<std::string> batches;
  for (const LayoutStep& step : steps())
    if (step.layout > layout && step.database == database)
      for (auto& batch : tsql::splitScript(std::string(step.script))) batches.push_back(std::move(batch));
  return batches;
}

void upgradeInstallation(const std::filesystem::path& folder) {
  std::optional<Failure> failed;
  for (std::size_t database = 0; database < databaseNames.size(); ++database) {
    try {
      upgradeDatabase(folder, database);
    } catch (const Failure& failure) {
      if (!failed) failed = failure;
    }
  }
  if (failed) throw *failed;
}

}  // namespace QVSa::embedded
