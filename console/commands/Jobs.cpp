#include "QVSa/organisation/Jobs.h"

#include <memory>
#include <optional>

#include "QVSa/hosting/SafeTexts.h"
#include "QVSa/organisation/Departments.h"
#include "console/Commands.h"
#include "console/Lookup.h"
#include "console/Table.h"

namespace QVSa::console {

namespace {

struct Options {
  std::optional<String> department;
  bool below = false;
  std::optional<String> role;
  std::optional<String> login;
  std::vector<Long> jobs;
};

Answer list(const Console& console, const Options& options) {
  const Department department = options.department ? departmentOf(console, *options.department) : Department();
  const Role role = options.role ? roleOf(console, *options.role) : Role();
  const Long userId = options.login ? userOf(console, *options.login).Id() : 0;
  Jobs jobs;
  console.connect(jobs);
  require(options.below ? jobs.GetAllOfDept(department.InnerId(), role.Name(), userId)
                        : jobs.GetAll(department.Id(), role.Name(), userId),
          jobs);
  Table table({{"Job", "job"}, {"Name", "name"}, {"Department", "department"}, {"Role", "role"}});
  for (const auto& job : jobs) table.row({job->Id(), job->Name(), job->deptId(), job->roleName()});
  return {table.text() + "\n" + counted(table.size(), "job") + ".\n", {{"jobs", table.document()}}};
}

// By level, since names repeat in different branches.
Answer chain(const Console& console, const Options& options) {
  Departments departments;
  console.connect(departments);
  require(departments.getAllSuperWithLevel(idList(options.jobs)), departments);
  Table table({{"Department", "department"}, {"Full name", "fullName"}});
  for (const auto& department : departments) table.row({department->Id(), department->fullName()});
  return {table.text(), {{"departments", table.document()}}};
}

}  // namespace

void addJobs(Console& console) {
  const auto options = std::make_shared<Options>();
  CLI::App* group = console.app().add_subcommand("job", "Jobs: roles held in departments")->require_subcommand(1);

  CLI::App* listCommand = group->add_subcommand("list", "Jobs by department, role and holder");
  CLI::Option* dept = listCommand->add_option("--dept", options->department, "Number of the department");
  listCommand->add_flag("--below", options->below, "And of all departments below it")->needs(dept);
  listCommand->add_option("--role", options->role, "The role's name");
  listCommand->add_option("--user", options->login, "The holder's login");
  console.command(listCommand, [&console, options] { return list(console, *options); });

  CLI::App* chainCommand = group->add_subcommand("chain", "The departments of jobs and all above them, the top first");
  chainCommand->add_option("jobs", options->jobs, "Job ids")->required();
  console.command(chainCommand, [&console, options] { return chain(console, *options); });
}

}  // namespace QVSa::console
