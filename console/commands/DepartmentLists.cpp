#include <algorithm>
#include <map>
#include <memory>

#include "QVSa/hosting/SafeTexts.h"
#include "QVSa/organisation/Departments.h"
#include "console/Commands.h"
#include "console/Lookup.h"
#include "console/Table.h"

namespace QVSa::console {

namespace {

struct Options {
  String top;
  bool byLevel = false;
};

void read(const Console& console, const Options& options, Departments& departments) {
  console.connect(departments);
  if (options.byLevel) {
    require(departments.GetAllWithLevel(), departments);
  } else {
    const String ids = options.top.empty() ? "" : idList({departmentOf(console, options.top).InnerId()});
    require(departments.GetAll(-1, ids), departments);
  }
}

Answer list(const Console& console, const Options& options) {
  Departments departments;
  read(console, options, departments);
  Table table({{"Number", "number"},
               {"Full name", "fullName"},
               {"Superior", "superior"},
               {"Organisation", "isOrganisation"},
               {"Outside", "isOuter"},
               {"Path", "path"}});
  for (const auto& department : departments)
    table.row({department->Id(), department->fullName(), department->Super(), department->isOrg(),
               department->isOuter(), department->fullId()});
  return {table.text() + "\n" + counted(table.size(), "department") + ".\n", {{"departments", table.document()}}};
}

// A tree as it stands in a directory: each branch under its superior, with the lines that lead to it.
class Tree {
 public:
  explicit Tree(const Departments& departments) {
    for (const auto& department : departments) undrawn_[department->InnerId()] = department->Id();
    for (const auto& department : departments) {
      const bool isTop = undrawn_.count(department->superInnerId()) == 0;
      (isTop ? tops_ : below_[department->superInnerId()]).push_back(department);
    }
    for (auto& [superior, children] : below_) sort(children);
  }

  Answer answer() {
    Answer result;
    result.document = {{"tree", Json::array()}, {"onNoTop", Json::array()}};
    const std::size_t all = undrawn_.size();
    for (const auto& top : tops_) {
      result.text += label(*top) + "\n";
      result.document["tree"].push_back(draw(*top, "", result.text));
    }
    result.text += "\n" + counted(all - undrawn_.size(), "department") + "; * marks an organisation.\n";
    if (undrawn_.empty()) return result;
    result.text += counted(undrawn_.size(), "more department") + " on no top, in a ring or below one:";
    for (const auto& [id, number] : undrawn_) {
      result.text += " " + number;
      result.document["onNoTop"].push_back(number);
    }
    result.text += "\n";
    return result;
  }

 private:
  using Children = std::vector<std::shared_ptr<Department>>;

  static void sort(Children& children) {
    std::sort(children.begin(), children.end(), [](const auto& a, const auto& b) { return a->Name() < b->Name(); });
  }

  static String label(const Department& department) {
    return department.Name() + (department.isOrg() ? " *" : "") + "  (" + department.Id() + ")";
  }

  Json draw(const Department& department, const String& indent, String& text) {
    undrawn_.erase(department.InnerId());
    Json node{{"number", department.Id()}, {"name", department.Name()}, {"isOrganisation", department.isOrg()}};
    Json& below = node["below"] = Json::array();
    const auto children = below_.find(department.InnerId());
    if (children == below_.end()) return node;
    for (const auto& child : children->second) {
      const bool isLast = child == children->second.back();
      text += indent + (isLast ? "└── " : "├── ") + label(*child) + "\n";
      below.push_back(draw(*child, indent + (isLast ? "    " : "│   "), text));
    }
    return node;
  }

  std::map<Long, String> undrawn_;  // numbers by inner id
  std::map<Long, Children> below_;
  Children tops_;
};

Answer tree(const Console& console, const Options& options) {
  Departments departments;
  read(console, options, departments);
  return Tree(departments).answer();
}

}  // namespace

void addDepartmentLists(Console& console) {
  const auto options = std::make_shared<Options>();
  CLI::App* group = console.app().get_subcommand("dept");

  CLI::App* listCommand = group->add_subcommand("list", "All departments, each behind those above it");
  CLI::Option* under = listCommand->add_option("--under", options->top, "Only this department and all below it");
  listCommand->add_flag("--by-level", options->byLevel, "Level by level, by number within a level")->excludes(under);
  console.command(listCommand, [&console, options] { return list(console, *options); });

  CLI::App* treeCommand = group->add_subcommand("tree", "The departments as a drawn tree");
  treeCommand->add_option("--under", options->top, "Only this department and all below it");
  console.command(treeCommand, [&console, options] { return tree(console, *options); });
}

}  // namespace QVSa::console
