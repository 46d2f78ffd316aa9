// Adds a report class with one below it, and shows the tree as XML.
//   report_classes SERVER

#include <QVSa/classification/Directory.h>
#include <iostream>

namespace {

bool add(const char* server, const char* name, const char* superior) {
  QVSa::Directory node;
  node.connect(server, "QVApp");
  node.Class(name);
  node.superClass(superior);
  if (node.Save()) return true;
  std::cerr << node.errDescription() << "\n";
  return false;
}

}  // namespace

int main(int argc, char** argv) {
  if (argc != 2) return 2;
  if (!add(argv[1], "Finance", "") || !add(argv[1], "Invoices", "Finance")) return 1;
  QVSa::Directory tree;
  tree.connect(argv[1], "QVApp");
  const QVSa::String xml = tree.GetAll();
  std::cout << xml << "\n";
  return xml.find("Finance,Invoices") == QVSa::String::npos ? 1 : 0;
}
