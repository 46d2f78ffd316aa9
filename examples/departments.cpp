// Adds two departments, one below the other, and shows the tree.
//   departments SERVER

#include <QVSa/organisation/Departments.h>
#include <iostream>

namespace {

bool add(const char* server, const char* number, const char* name, const char* superior) {
  QVSa::Department department;
  department.connect(server, "QVApp");
  department.Id(number);
  department.Name(name);
  department.Super(superior);
  if (department.Save()) return true;
  std::cerr << department.errDescription() << "\n";
  return false;
}

}  // namespace

int main(int argc, char** argv) {
  if (argc != 2) return 2;
  if (!add(argv[1], "S1", "Sales", "_root") || !add(argv[1], "S2", "East", "S1")) return 1;

  QVSa::Departments tree;
  tree.connect(argv[1], "QVApp");
  if (!tree.GetAll()) return 1;
  for (const auto& department : tree) std::cout << department->Id() << "  " << department->fullName() << "\n";
  return tree.Item("S2")->fullName() == "Sales-East" ? 0 : 1;
}
