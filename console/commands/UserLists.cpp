#include <memory>
#include <optional>

#include "QVSa/organisation/Jobs.h"
#include "QVSa/organisation/Users.h"
#include "console/Commands.h"
#include "console/Lookup.h"
#include "console/Table.h"

namespace QVSa::console {

namespace {

struct Options {
  std::optional<String> department;
  bool below = false;
  std::optional<String> role;
  std::optional<String> group;
  bool withoutBuiltIn = false;
  String login;
  std::optional<Long> job;
  std::optional<String> supervisor;
  bool none = false;
};

constexpr Integer byNobody = 0;
constexpr Integer byJob = 1;
constexpr Integer byUser = 2;

Answer listSubtree(const Console& console, const Department& top, const std::optional<Role>& role) {
  Users users;
  console.connect(users);
  require(role ? users.GetAllOfTheDeptAndRole(top.InnerId(), role->Name()) : users.GetAllOfTheDept(top.InnerId()),
          users);
  Table table({{"Id", "id"}, {"Name", "name"}, {"Department", "department"}});
  for (const auto& user : users) table.row({user->Id(), user->Name(), user->deptFullName()});
  return {table.text() + "\n" + counted(table.size(), "user") + ".\n", {{"users", table.document()}}};
}

Answer list(const Console& console, const Options& options) {
  const Department department = options.department ? departmentOf(console, *options.department) : Department();
  const std::optional<Role> role = options.role ? std::optional(roleOf(console, *options.role)) : std::nullopt;
  if (options.below) return listSubtree(console, department, role);
  Users users;
  console.connect(users);
  const Long groupId = options.group ? groupOf(console, *options.group).Id() : -1;
  require(users.GetAll(department.Id(), role ? role->Id() : 0, options.withoutBuiltIn, groupId), users);
  Table table(
      {{"Login", "login"}, {"Name", "name"}, {"Department", "department"}, {"Groups", "groups"}, {"Locked", "locked"}});
  for (const auto& user : users)
    table.row({user->Login(), user->Name(), user->deptFullName(), user->grpName(), user->locked()});
  return {table.text() + "\n" + counted(table.size(), "user") + ".\n", {{"users", table.document()}}};
}

String jobName(const Console& console, Long id) {
  Jobs jobs;
  console.connect(jobs);
  require(jobs.GetAll(), jobs);
  const auto job = jobs.Item(text(id));
  return job ? job->Name() : "";
}

String userName(const Console& console, Long id) {
  User user;
  console.connect(user);
  return user.GetOne(User::byId, id) ? user.Name() : "";
}

// Two of one name can't be listed. What the command did before is done all the same, so that this is a note.
void addSubordinates(Answer& answer, User& user) {
  const auto subordinates = user.getSubUsers();
  if (!subordinates) {
    answer.text += "\n" + user.errDescription() + "\n";
    answer.document["note"] = user.errDescription();
    return;
  }
  Table table({{"Subordinates", "login"}, {"", "name"}});
  for (const auto& subordinate : *subordinates) table.row({subordinate->Login(), subordinate->Name()});
  if (table.size() != 0) answer.text += "\n" + table.text();
  answer.document["subordinates"] = table.document();
}

Answer showManager(const Console& console, User& user) {
  Integer flag = byNobody;
  Long jobId = 0, userId = 0;
  require(user.getManager(flag, jobId, userId), user);
  Sheet sheet;
  sheet.line("User", "user", user.Name());
  sheet.line("Supervising job", "job", flag == byJob ? Json(jobName(console, jobId)) : Json());
  sheet.line("Supervisor", "supervisor", flag == byUser ? Json(userName(console, userId)) : Json());
  Answer answer{sheet.text(), sheet.document()};
  addSubordinates(answer, user);
  return answer;
}

Answer manager(const Console& console, const Options& options) {
  User user = userOf(console, options.login);
  if (options.job) {
    if (jobName(console, *options.job).empty()) throw Refusal("There is no job " + text(*options.job) + ".");
    require(user.setManager(byJob, *options.job), user);
  } else if (options.supervisor) {
    require(user.setManager(byUser, 0, userOf(console, *options.supervisor).Id()), user);
  } else if (options.none) {
    require(user.setManager(byNobody), user);
  }
  return showManager(console, user);
}

}  // namespace

void addUserLists(Console& console) {
  const auto options = std::make_shared<Options>();
  CLI::App* group = console.app().get_subcommand("user");

  CLI::App* listCommand = group->add_subcommand("list", "Users by department, role and group");
  CLI::Option* dept = listCommand->add_option("--dept", options->department, "Number of the department");
  CLI::Option* below = listCommand->add_flag("--below", options->below, "And of all departments below it")->needs(dept);
  listCommand->add_option("--role", options->role, "Only holders of the role");
  listCommand->add_option("--group", options->group, "Only members of the group")->excludes(below);
  listCommand->add_flag("--no-built-in", options->withoutBuiltIn, "Without built-in users")->excludes(below);
  console.command(listCommand, [&console, options] { return list(console, *options); });

  CLI::App* managerCommand = group->add_subcommand("manager", "Show or set a user's supervisor");
  managerCommand->add_option("login", options->login)->required();
  CLI::Option* job = managerCommand->add_option("--job", options->job, "Whoever holds this job");
  CLI::Option* who = managerCommand->add_option("--user", options->supervisor, "This user")->excludes(job);
  managerCommand->add_flag("--none", options->none, "Nobody")->excludes(job)->excludes(who);
  console.command(managerCommand, [&console, options] { return manager(console, *options); });
}

}  // namespace QVSa::console
