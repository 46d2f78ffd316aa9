#pragma once

#include <map>

#include "console/Console.h"
#include "console/OrganisationFiles.h"

namespace QVSa::console {

// Counts of one kind of rows in an import.
struct Tally {
  int added = 0;
  int changed = 0;
  int unchanged = 0;
  int left = 0;
};

// Brings the roles, the jobs and their holders in, and takes none away.
class HoldingsImport {
 public:
  // `userIds` by login; 0 for a user who is not stored yet, as in a dry run.
  HoldingsImport(const Console& console, const std::vector<HoldingRow>& holdings, std::map<String, Long> userIds,
                 bool dryRun)
      : console_(console), holdings_(holdings), userIds_(std::move(userIds)), dryRun_(dryRun) {}

  void run();

  const Tally& roles() const { return roles_; }
  const Tally& jobs() const { return jobs_; }
  const Tally& holders() const { return holders_; }

 private:
  using Job = std::pair<String, String>;  // role and department number

  void importRole(const String& name);
  void readJobs(const String& role);
  void importHolder(const String& login, const std::vector<const HoldingRow*>& rows);

  const Console& console_;
  const std::vector<HoldingRow>& holdings_;
  std::map<String, Long> userIds_;
  bool dryRun_;
  std::map<String, Long> departmentIds_;
  std::map<Job, Long> jobIds_;
  Tally roles_;
  Tally jobs_;
  Tally holders_;
};

}  // namespace QVSa::console
