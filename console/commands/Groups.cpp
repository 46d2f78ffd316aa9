#include <memory>

#include "QVSa/hosting/SafeTexts.h"
#include "QVSa/organisation/userGroups.h"
#include "console/Commands.h"
#include "console/Lookup.h"
#include "console/Table.h"

namespace QVSa::console {

namespace {

struct Options {
  String name;
  String description;
  std::vector<String> members;
  std::vector<String> roles;
  bool clearsMembers = false;
  bool clearsRoles = false;
};

Answer list(const Console& console) {
  userGroups groups;
  console.connect(groups);
  require(groups.GetAll(), groups);
  Table table({{"Id", "id"}, {"Name", "name"}, {"Description", "description"}});
  for (const auto& group : groups) table.row({group->Id(), group->Name(), group->description()});
  return {table.text(), {{"groups", table.document()}}};
}

Answer show(const Console& console, const String& name) {
  userGroup group = groupOf(console, name);
  String roles;
  require(group.GetRoles(roles), group);
  Table table({{"Login", "login"}, {"Name", "name"}, {"Department", "department"}});
  for (const String& id : memberIds(group)) {
    const User user = userWithId(console, id);
    table.row({user.Login(), user.Name(), user.deptFullName()});
  }
  Sheet sheet;
  sheet.line("Name", "name", group.Name()).line("Id", "id", group.Id());
  sheet.line("Description", "description", group.description()).line("Roles", "roles", roles);
  Answer answer{sheet.text() + "\n" + table.text(), sheet.document()};
  answer.document["members"] = table.document();
  return answer;
}

Answer add(const Console& console, const Options& options) {
  userGroup group;
  console.connect(group);
  group.Name(options.name);
  group.description(options.description);
  require(group.Save(), group);
  return show(console, options.name);
}

// Both settings are by the whole list: what is not named is left out.
Answer set(const Console& console, const Options& options) {
  userGroup group = groupOf(console, options.name);
  std::vector<Long> ids;
  for (const String& login : options.members) ids.push_back(userOf(console, login).Id());
  for (const String& role : options.roles) roleOf(console, role);
  const bool setsMembers = options.clearsMembers || !ids.empty();
  const bool setsRoles = options.clearsRoles || !options.roles.empty();
  if (setsMembers) require(group.SetUsers(idList(ids)), group);
  if (setsRoles && !group.SetRoles(join(options.roles, ",")))
    throw Refusal((setsMembers ? "The members are set, the roles are not: " : "") + group.errDescription(),
                  group.errNumber());
  return show(console, options.name);
}

Answer remove(const Console& console, const String& name) {
  userGroup group = groupOf(console, name);
  require(group.Delete(), group);
  return {"The group " + name + " is removed.\n", {{"removed", name}}};
}

}  // namespace

void addGroups(Console& console) {
  const auto options = std::make_shared<Options>();
  CLI::App* group = console.app().add_subcommand("group", "User groups, their members and roles");
  group->require_subcommand(1);
  const auto named = [&](const char* name, const char* description, auto run) {
    CLI::App* command = group->add_subcommand(name, description);
    command->add_option("group", options->name, "The group's name")->required();
    console.command(command, [&console, options, run] { return run(console, *options); });
    return command;
  };

  console.command(group->add_subcommand("list", "All groups"), [&console] { return list(console); });
  named("show", "A group, its roles and members",
        [](const Console& place, const Options& given) { return show(place, given.name); });
  named("add", "Add a group", add)->add_option("--description", options->description);
  CLI::App* setCommand = named("set", "Replace the members or the roles of a group", set);
  CLI::Option* members =
      setCommand->add_option("--members", options->members, "Logins, comma-separated")->delimiter(',');
  CLI::Option* roles =
      setCommand->add_option("--roles", options->roles, "Names of roles, comma-separated")->delimiter(',');
  setCommand->add_flag("--no-members", options->clearsMembers, "Empty the group")->excludes(members);
  setCommand->add_flag("--no-roles", options->clearsRoles, "Take all roles from the group")->excludes(roles);
  named("remove", "Remove a group",
        [](const Console& place, const Options& given) { return remove(place, given.name); });
}

}  // namespace QVSa::console
