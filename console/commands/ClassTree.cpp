#include "console/commands/ClassTree.h"

#include <pugixml.hpp>
#include <unordered_map>

#include "console/Answer.h"

namespace QVSa::console {

namespace {

using Children = std::unordered_map<String, std::vector<const ReportClass*>>;

// Path of the superior; empty at the top.
String superiorPath(const ReportClass& node) {
  const std::size_t own = node.name.size() + 1;
  return node.path.size() > own + 1 ? node.path.substr(0, node.path.size() - own) : "";
}

void draw(const Children& children, const String& path, const String& indent, String& text) {
  const auto found = children.find(path);
  if (found == children.end()) return;
  for (const ReportClass* node : found->second) {
    const bool last = node == found->second.back();
    text += indent + (last ? "└─ " : "├─ ") + node->name + "\n";
    if (node->path != path) draw(children, node->path, indent + (last ? "   " : "│  "), text);
  }
}

}  // namespace

std::vector<ReportClass> readClasses(const String& xml) {
  pugi::xml_document document;
  if (!document.load_string(xml.c_str(), pugi::parse_default | pugi::parse_ws_pcdata_single))
    throw Refusal("The listing of the classes can't be read.");
  std::vector<ReportClass> classes;
  for (const pugi::xml_node node : document.child("ds").children("d"))
    classes.push_back({node.text().get(), node.attribute("super").value(), node.attribute("path").value(),
                       node.attribute("full").value(), node.attribute("ordpath").value()});
  return classes;
}

String drawTree(const std::vector<ReportClass>& classes) {
  std::unordered_map<String, bool> listed;
  for (const ReportClass& node : classes) listed[node.path] = true;
  Children children;
  for (const ReportClass& node : classes) {
    const String above = superiorPath(node);
    children[listed.contains(above) ? above : ""].push_back(&node);
  }
  String text;
  draw(children, "", "", text);
  return text;
}

}  // namespace QVSa::console
