#include "QVSa/organisation/Roles.h"

#include <memory>

#include "QVSa/hosting/SafeTexts.h"
#include "QVSa/organisation/Jobs.h"
#include "QVSa/organisation/Users.h"
#include "console/Commands.h"
#include "console/Lookup.h"
#include "console/Table.h"

namespace QVSa::console {

namespace {

struct Options {
  String role;
  String description;
  String login;
  String department;
  std::vector<String> added;
  std::vector<String> removed;
};

Answer list(const Console& console) {
  Roles roles;
  console.connect(roles);
  require(roles.GetAll(), roles);
  Table table({{"Id", "id"}, {"Name", "name"}, {"Built-in", "builtIn"}, {"Description", "description"}});
  for (const auto& role : roles) table.row({role->Id(), role->Name(), role->builtIn(), role->description()});
  return {table.text(), {{"roles", table.document()}}};
}

Answer jobs(const Console& console, const String& name) {
  const Role role = roleOf(console, name);
  Jobs jobs;
  console.connect(jobs);
  require(jobs.GetAll("", name), jobs);
  Table table({{"Job", "job"}, {"Department", "department"}, {"Full name", "fullName"}});
  for (const auto& job : jobs) table.row({job->Id(), job->deptId(), job->deptFullName()});
  return {name + " is set in " + counted(table.size(), "department") + ".\n\n" + table.text(),
          {{"role", role.Name()}, {"jobs", table.document()}}};
}

Answer add(const Console& console, const Options& options) {
  Role role;
  console.connect(role);
  role.Name(options.role);
  role.description(options.description);
  require(role.Save(), role);
  return {"The role " + options.role + " is added.\n", {{"role", options.role}, {"id", role.Id()}}};
}

String innerIds(const Console& console, const std::vector<String>& numbers) {
  std::vector<Long> ids;
  ids.reserve(numbers.size());
  for (const String& number : numbers) ids.push_back(departmentOf(console, number).InnerId());
  return idList(ids);
}

Answer set(const Console& console, const Options& options) {
  Role role = roleOf(console, options.role);
  require(role.setJobs(innerIds(console, options.added), innerIds(console, options.removed)), role);
  return jobs(console, options.role);
}

Long jobOf(Role& role, const Department& department) {
  const Long job = role.GetJobIdOfTheDept(text(department.InnerId()));
  if (job < 1) throw Refusal(role.errDescription() + " (" + department.Id() + ")", role.errNumber());
  return job;
}

Answer hold(const Console& console, const Options& options, bool gives) {
  Role role = roleOf(console, options.role);
  const Long user = userOf(console, options.login).Id();
  const String pair = idPairs({{user, jobOf(role, departmentOf(console, options.department))}});
  require(gives ? role.UpdateUsers(pair, "") : role.UpdateUsers("", pair), role);
  return {
      options.login + (gives ? " holds " : " no longer holds ") + options.role + " in " + options.department + ".\n",
      {{"login", options.login}, {"role", options.role}, {"department", options.department}, {"holds", gives}}};
}

Answer holders(const Console& console, const Options& options) {
  Role role = roleOf(console, options.role);
  if (!options.department.empty()) departmentOf(console, options.department);
  constexpr Boolean builtInToo = false;
  const auto users = role.GetUsers(true, builtInToo, options.department);
  require(users != nullptr, role);
  Table table({{"Login", "login"}, {"Name", "name"}, {"Department", "department"}});
  for (const auto& user : *users) table.row({user->Login(), user->Name(), user->deptFullName()});
  return {table.text() + "\n" + counted(table.size(), "holder") + ".\n",
          {{"role", options.role}, {"holders", table.document()}}};
}

Answer reach(const Console& console, const String& name) {
  Role role = roleOf(console, name);
  const String xml = role.getAcl();
  if (xml.empty()) require(role.errNumber() == 0, role);
  return {xml.empty() ? name + " reaches nothing.\n" : xml + "\n", {{"role", name}, {"acl", xml}}};
}

Answer remove(const Console& console, const String& name) {
  Role role = roleOf(console, name);
  if (role.builtIn()) throw Refusal("The role " + name + " belongs to the system.");
  require(role.Delete(), role);
  return {"The role " + name + " is removed, with its jobs.\n", {{"removed", name}}};
}

void addHolding(Console& console, CLI::App* group, const std::shared_ptr<Options>& options, const char* name,
                bool gives, const char* description) {
  CLI::App* command = group->add_subcommand(name, description);
  command->add_option("role", options->role)->required();
  command->add_option("login", options->login)->required();
  command->add_option("department", options->department, "Number of the department")->required();
  console.command(command, [&console, options, gives] { return hold(console, *options, gives); });
}

}  // namespace

void addRoles(Console& console) {
  const auto options = std::make_shared<Options>();
  CLI::App* group = console.app().add_subcommand("role", "Roles, where they are set, and who holds them");
  group->require_subcommand(1);
  const auto named = [&](const char* name, const char* description, auto run) {
    CLI::App* command = group->add_subcommand(name, description);
    command->add_option("role", options->role, "The role's name")->required();
    console.command(command, [&console, options, run] { return run(console, *options); });
    return command;
  };

  console.command(group->add_subcommand("list", "All roles"), [&console] { return list(console); });
  named("jobs", "The departments in which a role is set",
        [](const Console& place, const Options& given) { return jobs(place, given.role); });
  named("add", "Add a role", add)->add_option("--description", options->description);
  CLI::App* setCommand = named("set", "Set a role in departments, or take it out of them", set);
  setCommand->add_option("--in", options->added, "Numbers of departments, comma-separated")->delimiter(',');
  setCommand->add_option("--out-of", options->removed, "Numbers of departments; the jobs there are removed")
      ->delimiter(',');
  named("holders", "Who holds a role, directly or through a group", holders)
      ->add_option("--dept", options->department, "Only users of this department");
  addHolding(console, group, options, "give", true, "Give a user a role in a department");
  addHolding(console, group, options, "take", false, "Take a role in a department from a user");
  named("reach", "What a role may reach, as XML",
        [](const Console& place, const Options& given) { return reach(place, given.role); });
  named("remove", "Remove a role and its jobs",
        [](const Console& place, const Options& given) { return remove(place, given.role); });
}

}  // namespace QVSa::console
