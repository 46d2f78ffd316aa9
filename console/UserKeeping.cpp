#include "console/UserKeeping.h"

#include <algorithm>

#include "QVSa/organisation/Jobs.h"
#include "QVSa/organisation/userGroups.h"
#include "console/Lookup.h"

namespace QVSa::console {

namespace {

struct Membership {
  std::shared_ptr<userGroup> group;
  std::vector<String> members;
};

String jobsOf(const Console& console, Long userId) {
  Jobs jobs;
  console.connect(jobs);
  require(jobs.GetAll("", "", userId), jobs);
  std::vector<String> ids;
  for (const auto& job : jobs) ids.push_back(text(job->Id()));
  return join(ids, ",");
}

std::vector<Membership> membershipsOf(const Console& console, const User& user) {
  if (user.grpName().empty()) return {};
  userGroups groups;
  console.connect(groups);
  require(groups.GetAll(), groups);
  std::vector<Membership> result;
  for (const auto& group : groups) {
    std::vector<String> members = memberIds(*group);
    if (std::find(members.begin(), members.end(), text(user.Id())) != members.end())
      result.push_back({group, std::move(members)});
  }
  return result;
}

}  // namespace

void saveKept(const Console& console, User& user) {
  user.setJobs(jobsOf(console, user.Id()));
  const std::vector<Membership> memberships = membershipsOf(console, user);
  const String groupNames = user.grpName();
  if (memberships.size() > 1) user.grpName("");
  constexpr Boolean passwordIsNotNew = true;
  require(user.Save(passwordIsNotNew), user);
  if (memberships.size() < 2) return;
  for (const auto& [group, members] : memberships) {
    if (group->SetUsers(join(members, ","))) continue;
    throw Refusal(
        user.Login() + " is saved, but no longer in all of the groups " + groupNames + ": " + group->errDescription(),
        group->errNumber());
  }
}

}  // namespace QVSa::console
