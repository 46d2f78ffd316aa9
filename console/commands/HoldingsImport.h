#pragma once

#include <map>

#include "QVSa/organisation/Departments.h"
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
  using Rows = std::vector<const HoldingRow*>;
  using Job = std::pair<String, String>;  // role and department number

  // In small letters, as the database ignores the case.
  static Job jobOf(const String& role, const String& department) { return {lowerCase(role), lowerCase(department)}; }

  // All rows of one role, all rows of one user.
  void importRole(const Rows& rows);
  void importHolder(const String& login, const Rows& rows);
  void readJobs(const String& role);
  Long departmentId(const String& number) const;

  const Console& console_;
  const std::vector<HoldingRow>& holdings_;
  std::map<String, Long> userIds_;
  bool dryRun_;
  Departments departments_;
  std::map<Job, Long> jobIds_;
  Tally roles_;
  Tally jobs_;
  Tally holders_;
};

}  // namespace QVSa::console
