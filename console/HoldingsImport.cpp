#include "console/HoldingsImport.h"

#include <set>

#include "QVSa/organisation/Departments.h"
#include "QVSa/organisation/Jobs.h"
#include "QVSa/organisation/Role.h"
#include "console/Progress.h"

namespace QVSa::console {

void HoldingsImport::run() {
  Departments departments;
  console_.connect(departments);
  require(departments.GetAll(), departments);
  for (const auto& department : departments) departmentIds_[department->Id()] = department->InnerId();

  std::set<String> roles;
  std::map<String, std::vector<const HoldingRow*>> byLogin;
  for (const HoldingRow& row : holdings_) {
    roles.insert(row.role);
    byLogin[row.login].push_back(&row);
  }
  for (const String& role : roles) importRole(role);
  Progress progress("holders", byLogin.size());
  for (const auto& [login, rows] : byLogin) {
    importHolder(login, rows);
    progress.step();
  }
}

void HoldingsImport::importRole(const String& name) {
  Role role;
  console_.connect(role);
  const bool found = role.GetOne(2, name);
  if (!found && role.errNumber() != messageNumber(1201)) require(false, role);
  ++(found ? roles_.unchanged : roles_.added);
  if (!found && !dryRun_) {
    role.Name(name);
    require(role.Save(), role);
  }

  readJobs(name);
  std::set<String> seen;
  std::vector<String> missing;
  for (const HoldingRow& row : holdings_) {
    if (row.role != name || !seen.insert(row.department).second) continue;
    const bool isThere = jobIds_.count({name, row.department}) != 0;
    ++(isThere ? jobs_.unchanged : jobs_.added);
    if (!isThere) missing.push_back(text(departmentIds_[row.department]));
  }
  if (dryRun_ || missing.empty()) return;
  require(role.setJobs(join(missing, ",")), role);
  readJobs(name);
}

void HoldingsImport::readJobs(const String& role) {
  Jobs jobs;
  console_.connect(jobs);
  require(jobs.GetAll("", role), jobs);
  for (const auto& job : jobs) jobIds_.emplace(Job(role, job->deptId()), job->Id());
}

void HoldingsImport::importHolder(const String& login, const std::vector<const HoldingRow*>& rows) {
  const Long userId = userIds_.at(login);
  std::set<Long> held;
  if (userId != 0) {
    Jobs jobs;
    console_.connect(jobs);
    require(jobs.GetAll("", "", userId), jobs);
    for (const auto& job : jobs) held.insert(job->Id());
  }
  std::vector<String> pairs;
  for (const HoldingRow* row : rows) {
    const auto job = jobIds_.find({row->role, row->department});
    const bool holds = job != jobIds_.end() && held.count(job->second) != 0;
    ++(holds ? holders_.unchanged : holders_.added);
    if (!holds && !dryRun_) pairs.push_back(text(userId) + "," + text(job->second));
  }
  Role role;
  console_.connect(role);
  if (!role.UpdateUsers(join(pairs, "|"), "")) throw Refusal(login + ": " + role.errDescription(), role.errNumber());
}

}  // namespace QVSa::console
