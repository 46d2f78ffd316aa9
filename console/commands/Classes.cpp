#include <algorithm>
#include <ctime>
#include <memory>
#include <optional>

#include "QVSa/classification/Directory.h"
#include "QVSa/identity/User.h"
#include "console/Commands.h"
#include "console/Table.h"
#include "console/commands/ClassTree.h"

namespace QVSa::console {

namespace {

struct Options {
  String name;
  String newName;
  String superior;
  std::vector<String> names;
  String user = "Admin";
  bool othersDesign = false;
  bool toTop = false;
  bool cutOff = false;
};

constexpr Integer byName = 1;

Date now() {
  const std::time_t seconds = std::time(nullptr);
  std::tm local{};
  localtime_r(&seconds, &local);
  return Date(local.tm_year + 1900, local.tm_mon + 1, local.tm_mday, local.tm_hour, local.tm_min, local.tm_sec);
}

// A missing node is no failure of the load: the name tells.
Directory load(const Console& console, const String& name) {
  Directory node;
  console.connect(node);
  require(node.GetOne(byName, name), node);
  if (node.Class().empty()) throw Refusal("There is no class " + name + ".");
  return node;
}

void stamp(const Console& console, Directory& node, const String& login) {
  User user;
  console.connect(user);
  require(user.GetOne(User::byLogin, login), user);
  node.updUserId(user.Id());
  node.upduserName(user.Name());
  node.updTime(now());
}

// The whole tree, or with a name its direct members (" ": the roots).
std::vector<ReportClass> listed(const Console& console, const String& superior = "") {
  Directory tree;
  console.connect(tree);
  const String xml = tree.GetAll(superior);
  require(!xml.empty(), tree);
  return readClasses(xml);
}

std::vector<String> membersOf(const Console& console, const String& superior) {
  std::vector<String> names;
  for (const ReportClass& member : listed(console, superior.empty() ? " " : superior)) names.push_back(member.name);
  return names;
}

Answer tree(const Console& console, const String& sentence = "") {
  const auto classes = listed(console);
  Json document = Json::array();
  for (const ReportClass& node : classes)
    document.push_back({{"name", node.name},
                        {"superior", node.superior},
                        {"path", node.path},
                        {"fullName", node.fullName},
                        {"order", node.ordPath}});
  const String text = classes.empty() ? "There are no report classes.\n" : drawTree(classes);
  return {sentence.empty() ? text : sentence + "\n\n" + text, {{"classes", document}}};
}

// The paths are made of names with dots around them, the full names and the lists of the library with commas between.
void requirePlain(const String& name) {
  if (name.empty() || name.find_first_of(",.") != String::npos)
    throw Misuse("The name of a class can't be empty, nor hold a comma or a dot.");
}

Answer add(const Console& console, const Options& options) {
  requirePlain(options.name);
  Directory node;
  console.connect(node);
  node.Class(options.name);
  node.superClass(options.superior);
  node.otherCanDesign(options.othersDesign);
  stamp(console, node, options.user);
  node.creUserId(node.updUserId());
  node.creUserName(node.upduserName());
  node.createTime(node.updTime());
  require(node.Save(), node);
  return tree(console, "The class is added.");
}

// Moved below itself, a class would be cut off from the tree with all its branch.
void refuseRing(const Console& console, const String& name, const String& superior) {
  String path, superiorPath;
  for (const ReportClass& node : listed(console)) {
    if (node.name == name) path = node.path;
    if (node.name == superior) superiorPath = node.path;
  }
  if (superiorPath.rfind(path, 0) == 0) throw Refusal(superior + " is " + name + " itself or lies below it.");
}

Answer move(const Console& console, const Options& options) {
  if (options.toTop != options.superior.empty()) throw Misuse("Name the new superior, or --to-top.");
  Directory node = load(console, options.name);
  if (!options.toTop) {
    node.superClass(load(console, options.superior).Class());
    refuseRing(console, node.Class(), node.superClass());
  } else {
    node.superClass("");
  }
  stamp(console, node, options.user);
  require(node.Save(), node);
  return tree(console, "The class is moved, with all below it, and the last there.");
}

// What the ordPath of a superior's members begins with; nothing where it was removed, or has no place in the order.
std::optional<String> placeBelow(const Console& console, const String& superior) {
  if (superior.empty()) return "";
  Directory above;
  console.connect(above);
  require(above.GetOne(byName, superior), above);
  return above.ordPath().empty() ? std::nullopt : std::optional(above.ordPath() + ".");
}

// The members of one place as the library takes them.
String listOf(const std::vector<String>& names) {
  for (const String& name : names)
    if (name.find(',') != String::npos) throw Misuse("A place with a comma in a class's name can't be put in order.");
  return join(names, ",");
}

void setOrder(const Console& console, const String& ordPath, const String& list) {
  Directory tree;
  console.connect(tree);
  require(tree.updateSubOrder(ordPath, list), tree);
}

// The library leaves the members under the old name of their superior, and puts what it saves to the end.
Answer rename(const Console& console, const Options& options) {
  requirePlain(options.newName);
  Directory node = load(console, options.name);
  const String oldName = node.Class();
  const std::optional<String> place = placeBelow(console, node.superClass());
  std::vector<String> siblings = membersOf(console, node.superClass());
  std::ranges::replace(siblings, oldName, options.newName);
  const String list = place ? listOf(siblings) : "";
  const std::vector<String> members = membersOf(console, oldName);
  node.Class(options.newName);
  stamp(console, node, options.user);
  require(node.Save(), node);
  for (const String& member : members) {
    Directory below = load(console, member);
    below.superClass(options.newName);
    require(below.Save(), below);
  }
  if (place) setOrder(console, *place, list);
  return tree(console, "The class is renamed.");
}

Answer order(const Console& console, const Options& options) {
  std::vector<String> known = membersOf(console, options.superior);
  std::vector<String> given = options.names;
  std::ranges::sort(known);
  std::ranges::sort(given);
  if (known != given) throw Misuse("Name all classes of that place, each once.");
  const std::optional<String> place = placeBelow(console, options.superior);
  if (!place) throw Refusal(options.superior + " is not there, or has no place in the order itself.");
  setOrder(console, *place, listOf(options.names));
  return tree(console, "The classes are in the new order.");
}

// What lies below a removed class stays, cut off from what was above.
Answer remove(const Console& console, const Options& options) {
  Directory node = load(console, options.name);
  if (!options.cutOff && !membersOf(console, node.Class()).empty())
    throw Refusal(node.Class() + " has classes below it. With --cut-off they stay, at the top of the tree.");
  require(node.Delete(), node);
  return tree(console, "The class is removed.");
}

void addChanges(Console& console, CLI::App* group, const std::shared_ptr<Options>& options) {
  CLI::App* moveCommand = group->add_subcommand("move", "Put a class under another one");
  moveCommand->add_option("name", options->name)->required();
  moveCommand->add_option("superior", options->superior, "The new superior");
  moveCommand->add_flag("--to-top", options->toTop, "Make it a root");
  moveCommand->add_option("--user", options->user, "Login of who does it")->capture_default_str();
  console.command(moveCommand, [&console, options] { return move(console, *options); });

  CLI::App* renameCommand = group->add_subcommand("rename", "Give a class another name");
  renameCommand->add_option("name", options->name)->required();
  renameCommand->add_option("new-name", options->newName)->required();
  renameCommand->add_option("--user", options->user, "Login of who does it")->capture_default_str();
  console.command(renameCommand, [&console, options] { return rename(console, *options); });

  CLI::App* orderCommand = group->add_subcommand("order", "Put the classes of one place in order");
  orderCommand->add_option("names", options->names, "All of them, in their new order")->required();
  orderCommand->add_option("--under", options->superior, "Their superior; without it, the roots");
  console.command(orderCommand, [&console, options] { return order(console, *options); });

  CLI::App* removeCommand = group->add_subcommand("remove", "Remove a class");
  removeCommand->add_option("name", options->name)->required();
  removeCommand->add_flag("--cut-off", options->cutOff, "Also where classes lie below it");
  console.command(removeCommand, [&console, options] { return remove(console, *options); });
}

}  // namespace

void addClasses(Console& console) {
  const auto options = std::make_shared<Options>();
  CLI::App* group = console.app().add_subcommand("class", "The classes of reports")->require_subcommand(1);

  CLI::App* treeCommand = group->add_subcommand("tree", "All classes, drawn as a tree");
  console.command(treeCommand, [&console] { return tree(console); });

  CLI::App* addCommand = group->add_subcommand("add", "Add a class, as the last of its place");
  addCommand->add_option("name", options->name)->required();
  addCommand->add_option("--under", options->superior, "The superior; without it, a root");
  addCommand->add_option("--user", options->user, "Login of who does it")->capture_default_str();
  addCommand->add_flag("--others-design", options->othersDesign, "Others may design reports in it as well");
  console.command(addCommand, [&console, options] { return add(console, *options); });

  addChanges(console, group, options);
}

}  // namespace QVSa::console
