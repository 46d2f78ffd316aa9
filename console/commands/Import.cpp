#include <map>
#include <memory>
#include <optional>

#include "QVSa/hosting/UserKeeping.h"
#include "QVSa/identity/User.h"
#include "QVSa/identity/safeRule.h"
#include "QVSa/organisation/Department.h"
#include "console/Commands.h"
#include "console/Passwords.h"
#include "console/Progress.h"
#include "console/Table.h"
#include "console/commands/HoldingsImport.h"

namespace QVSa::console {

namespace {

struct Options {
  String folder;
  bool dryRun = false;
};

// One run of the import. Each row is saved by itself: after a refusal the rows before it stay, and the import can be
// run again, since it passes over what is there already.
class Import {
 public:
  Import(const Console& console, Organisation organisation, bool dryRun)
      : console_(console), organisation_(std::move(organisation)), dryRun_(dryRun) {}

  Answer run();

 private:
  std::vector<Department> loadDepartments();
  void importDepartments();
  void importDepartment(const DepartmentRow& row, Department& department);
  void importUser(const UserRow& row);
  void addUser(const UserRow& row, User& user);
  void changeUser(const UserRow& row, User& user);
  void choosePassword();
  template <class Object>
  void save(const String& key, bool saved, const Object& object) const;
  Answer answer() const;

  const Console& console_;
  Organisation organisation_;
  bool dryRun_;
  bool treeIsEmpty_ = true;
  Tally departments_;
  Tally users_;
  std::map<String, Long> userIds_;  // by login; 0 where the user is not stored
  std::optional<HoldingsImport> holdings_;
  std::vector<String> left_;  // sentences about rows that differ and were not written
  String password_;           // of the new users
  bool passwordMadeUp_ = false;
};

template <class Object>
void Import::save(const String& key, bool saved, const Object& object) const {
  if (!saved) throw Refusal(key + ": " + object.errDescription(), object.errNumber());
}

Answer Import::run() {
  importDepartments();
  {
    Progress progress("users", organisation_.users.size());
    for (const UserRow& row : organisation_.users) {
      importUser(row);
      progress.step();
    }
  }
  if (!organisation_.holdings.empty()) {
    holdings_.emplace(console_, organisation_.holdings, userIds_, dryRun_);
    holdings_->run();
  }
  return answer();
}

std::vector<Department> Import::loadDepartments() {
  std::vector<Department> result;
  for (const DepartmentRow& row : organisation_.departments) {
    Department& department = result.emplace_back();
    console_.connect(department);
    const bool found = department.GetOne(Department::byNumber, row.number);
    if (!found && department.errNumber() != messageNumber(message::departmentUnknown)) require(false, department);
    if (found && row.number != "_root") treeIsEmpty_ = false;
  }
  return result;
}

void Import::importDepartments() {
  std::vector<Department> departments = loadDepartments();
  Progress progress("departments", departments.size());
  for (std::size_t i = 0; i < departments.size(); ++i) {
    importDepartment(organisation_.departments[i], departments[i]);
    progress.step();
  }
}

void Import::importDepartment(const DepartmentRow& row, Department& department) {
  const bool isNew = department.InnerId() == 0;
  if (!isNew && department.Name() == row.name && sameText(department.Super(), row.superior) &&
      department.isOrg() == row.isOrganisation) {
    ++departments_.unchanged;
    return;
  }
  // A rename of the root replaces its old name wherever that text stands in the full names below it.
  if (row.number == "_root" && !treeIsEmpty_) {
    ++departments_.left;
    left_.push_back("_root is called " + department.Name() + " here, and has departments below it.");
    return;
  }
  ++(isNew ? departments_.added : departments_.changed);
  if (dryRun_) return;
  department.Id(row.number);
  department.Name(row.name);
  department.Super(row.superior);
  department.isOrg(row.isOrganisation);
  save(row.number, department.Save(), department);
}

void Import::importUser(const UserRow& row) {
  User user;
  console_.connect(user);
  if (!user.GetOne(User::byLogin, row.login)) {
    if (user.errNumber() != messageNumber(message::userUnknown)) require(false, user);
    addUser(row, user);
  } else if (user.Name() == row.name && sameText(user.deptId(), row.department)) {
    ++users_.unchanged;
  } else {
    changeUser(row, user);
  }
  userIds_[row.login] = user.Id();
}

void Import::addUser(const UserRow& row, User& user) {
  ++users_.added;
  if (dryRun_) return;
  if (password_.empty()) choosePassword();
  user.Login(row.login);
  user.Name(row.name);
  user.deptId(row.department);
  user.Pwd(password_);
  save(row.login, user.Save(), user);
}

void Import::changeUser(const UserRow& row, User& user) {
  ++users_.changed;
  if (dryRun_) return;
  Department department;
  console_.connect(department);
  require(department.GetOne(Department::byNumber, row.department), department);
  user.Name(row.name);
  user.setDept(department);
  UserKeeping keeping;
  console_.connect(keeping);
  save(row.login, keeping.save(user), keeping);
}

void Import::choosePassword() {
  password_ = askNewPasswordOrNone("First password of all new users (empty: make one up)");
  passwordMadeUp_ = password_.empty();
  if (!passwordMadeUp_) return;
  safeRule rule;
  console_.connect(rule);
  require(rule.GetOne(), rule);
  password_ = makePassword(rule.minLen());
}

Answer Import::answer() const {
  Table table({{"", "what"}, {"New", "new"}, {"Changed", "changed"}, {"Unchanged", "unchanged"}, {"Left", "left"}});
  const auto row = [&](const char* what, const Tally& tally) {
    table.row({what, tally.added, tally.changed, tally.unchanged, tally.left});
  };
  row("departments", departments_);
  row("users", users_);
  if (holdings_) {
    row("roles", holdings_->roles());
    row("jobs", holdings_->jobs());
    row("holdings", holdings_->holders());
  }
  Answer result{table.text(), {{"dryRun", dryRun_}, {"counts", table.document()}, {"left", left_}}};
  for (const String& sentence : left_) result.text += sentence + "\n";
  if (dryRun_) result.text += "\nNothing was written.\n";
  if (passwordMadeUp_) {
    result.text += "\nThe first password of the new users, shown this once: " + password_ + "\n";
    result.document["firstPassword"] = password_;
  }
  return result;
}

}  // namespace

void addImport(Console& console) {
  const auto options = std::make_shared<Options>();
  CLI::App* group = console.app().add_subcommand("import", "Bring in data")->require_subcommand(1);
  CLI::App* command = group->add_subcommand(
      "organisation", "Departments, users, roles and their holders from departments.csv, users.csv and holdings.csv");
  command->add_option("folder", options->folder, "The folder of the files")->required()->check(CLI::ExistingDirectory);
  command->add_flag("--dry-run", options->dryRun, "Tell what would be done, and write nothing");
  console.command(command, [&console, options] {
    return Import(console, readOrganisation(options->folder), options->dryRun).run();
  });
}

}  // namespace QVSa::console
