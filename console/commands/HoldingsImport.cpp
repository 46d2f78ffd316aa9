#include "console/commands/HoldingsImport.h"

#include <set>

#include "QVSa/hosting/SafeTexts.h"
#include "QVSa/organisation/Jobs.h"
#include "QVSa/organisation/Role.h"
#include "console/Progress.h"

namespace QVSa::console {

void HoldingsImport::run() {
  console_.connect(departments_);
  require(departments_.GetAll(), departments_);

  std::map<String, Rows> byRole, byLogin;
  for (const HoldingRow& row : holdings_) {
    byRole[lowerCase(row.role)].push_back(&row);
    byLogin[row.login].push_back(&row);
  }
  for (const auto& [role, rows] : byRole) importRole(rows);
  Progress progress("holders", byLogin.size());
  for (const auto& [login, rows] : byLogin) {
    importHolder(login, rows);
    progress.step();
  }
}

Long HoldingsImport::departmentId(const String& number) const {
  const auto department = departments_.Item(number);
  if (!department) throw Refusal("There is no department " + number + ".");
  return department->InnerId();
}

void HoldingsImport::importRole(const Rows& rows) {
  const String& name = rows.front()->role;
  Role role;
  console_.connect(role);
  const bool found = role.GetOne(Role::byName, name);
  if (!found && role.errNumber() != messageNumber(message::roleUnknown)) require(false, role);
  ++(found ? roles_.unchanged : roles_.added);
  if (!found && !dryRun_) {
    role.Name(name);
    require(role.Save(), role);
  }

  readJobs(name);
  std::set<Job> seen;
  std::vector<Long> missing;
  for (const HoldingRow* row : rows) {
    const Job job = jobOf(row->role, row->department);
    if (!seen.insert(job).second) continue;
    const bool isThere = jobIds_.count(job) != 0;
    ++(isThere ? jobs_.unchanged : jobs_.added);
    if (!isThere && !dryRun_) missing.push_back(departmentId(row->department));
  }
  if (missing.empty()) return;
  require(role.setJobs(idList(missing)), role);
  readJobs(name);
}

void HoldingsImport::readJobs(const String& role) {
  Jobs jobs;
  console_.connect(jobs);
  require(jobs.GetAll("", role), jobs);
  for (const auto& job : jobs) jobIds_.emplace(jobOf(role, job->deptId()), job->Id());
}

void HoldingsImport::importHolder(const String& login, const Rows& rows) {
  const Long userId = userIds_.at(login);
  std::set<Long> held;
  if (userId != 0) {
    Jobs jobs;
    console_.connect(jobs);
    require(jobs.GetAll("", "", userId), jobs);
    for (const auto& job : jobs) held.insert(job->Id());
  }
  std::vector<std::pair<Long, Long>> pairs;
  for (const HoldingRow* row : rows) {
    const auto job = jobIds_.find(jobOf(row->role, row->department));
    const bool isThere = job != jobIds_.end();
    if (!isThere && !dryRun_) throw Refusal("The job " + row->role + " could not be made in " + row->department + ".");
    const bool holds = isThere && !held.insert(job->second).second;
    ++(holds ? holders_.unchanged : holders_.added);
    if (!holds && !dryRun_) pairs.emplace_back(userId, job->second);
  }
  Role role;
  console_.connect(role);
  if (!role.UpdateUsers(idPairs(pairs), "")) throw Refusal(login + ": " + role.errDescription(), role.errNumber());
}

}  // namespace QVSa::console
