#include <memory>

#include "console/Commands.h"
#include "console/Lookup.h"
#include "console/Table.h"

namespace QVSa::console {

namespace {

struct Options {
  String number;
  String name;
  String superior = "_root";
  bool organisation = false;
  bool outer = false;
};

Answer show(const Console& console, const String& number) {
  const Department department = departmentOf(console, number);
  Sheet sheet;
  sheet.line("Number", "number", department.Id()).line("Name", "name", department.Name());
  sheet.line("Full name", "fullName", department.fullName()).line("Superior", "superior", department.Super());
  sheet.line("Organisation", "organisation", department.Org())
      .line("Is one itself", "isOrganisation", department.isOrg());
  sheet.line("Outside users", "isOuter", department.isOuter()).line("Inner id", "innerId", department.InnerId());
  sheet.line("Path", "path", department.fullId());
  return {sheet.text(), sheet.document()};
}

// What was saved, as the database has it now.
Answer saved(const Console& console, const String& number, const String& sentence) {
  Answer answer = show(console, number);
  answer.text = sentence + "\n\n" + answer.text;
  return answer;
}

void requireNew(const Console& console, const String& number) {
  Department department;
  console.connect(department);
  if (department.GetOne(Department::byNumber, number)) throw Refusal("Department " + number + " exists already.");
  // Any other failure tells nothing of whether it exists.
  require(department.errNumber() == messageNumber(message::departmentUnknown), department);
}

Answer add(const Console& console, const Options& options) {
  requireNew(console, options.number);
  Department department;
  console.connect(department);
  department.Id(options.number);
  department.Name(options.name);
  department.Super(options.superior);
  department.isOrg(options.organisation);
  department.isOuter(options.outer);
  require(department.Save(), department);
  return saved(console, options.number, "The department is added.");
}

Answer rename(const Console& console, const Options& options) {
  Department department = departmentOf(console, options.number);
  if (department.Id() == "_root")
    throw Refusal("_root bears the company's name; \"settings set --name\" changes both.");
  department.Name(options.name);
  require(department.Save(), department);
  return saved(console, options.number, "The department is renamed, with the full names of all below it.");
}

void refuseTop(const Department& department) {
  if (department.Id() == "_root" || department.Id() == "_out")
    throw Refusal("The department " + department.Id() + " belongs to the system.");
}

// The library moves a department below itself when asked to, which would cut the branch off the tree.
void refuseRing(const Department& department, const Department& superior) {
  if (superior.fullId().rfind(department.fullId(), 0) == 0)
    throw Refusal(superior.Id() + " is " + department.Id() + " itself or lies below it.");
}

Answer move(const Console& console, const Options& options) {
  Department department = departmentOf(console, options.number);
  refuseTop(department);
  refuseRing(department, departmentOf(console, options.superior));
  department.Super(options.superior);
  require(department.Save(), department);
  return saved(console, options.number, "The department is moved, with all below it.");
}

Answer remove(const Console& console, const String& number) {
  Department department = departmentOf(console, number);
  refuseTop(department);
  require(department.Delete(), department);
  return {"Department " + number + " is removed, with its jobs.\n", {{"removed", number}}};
}

}  // namespace

void addDepartments(Console& console) {
  const auto options = std::make_shared<Options>();
  CLI::App* group = console.app().add_subcommand("dept", "Show and change departments")->require_subcommand(1);

  CLI::App* showCommand = group->add_subcommand("show", "A department");
  showCommand->add_option("number", options->number)->required();
  console.command(showCommand, [&console, options] { return show(console, options->number); });

  CLI::App* addCommand = group->add_subcommand("add", "Add a department");
  addCommand->add_option("number", options->number)->required();
  addCommand->add_option("name", options->name)->required();
  addCommand->add_option("--under", options->superior, "Number of the superior department")->capture_default_str();
  addCommand->add_flag("--organisation", options->organisation, "It is an organisation of its own inside the tree");
  addCommand->add_flag("--outer", options->outer, "It is for outside users; can't be changed later");
  console.command(addCommand, [&console, options] { return add(console, *options); });

  CLI::App* renameCommand = group->add_subcommand("rename", "Give a department another name");
  renameCommand->add_option("number", options->number)->required();
  renameCommand->add_option("name", options->name, "The new name")->required();
  console.command(renameCommand, [&console, options] { return rename(console, *options); });

  CLI::App* moveCommand = group->add_subcommand("move", "Put a department under another one");
  moveCommand->add_option("number", options->number)->required();
  moveCommand->add_option("superior", options->superior, "Number of the new superior")->required();
  console.command(moveCommand, [&console, options] { return move(console, *options); });

  CLI::App* removeCommand = group->add_subcommand("remove", "Remove an empty department and its jobs");
  removeCommand->add_option("number", options->number)->required();
  console.command(removeCommand, [&console, options] { return remove(console, options->number); });
}

}  // namespace QVSa::console
