// Changes one of the settings and keeps the others.
//   settings SERVER NAME

#include <QVSa/hosting/HomeKeeping.h>
#include <iostream>

int main(int argc, char** argv) {
  if (argc != 3) return 2;
  QVSa::HomeKeeping keeping;
  keeping.connect(argv[1], "QVApp");
  QVSa::Home home;
  if (!keeping.load(home)) {
    std::cerr << keeping.errDescription() << "\n";
    return 1;
  }
  std::cout << "It was \"" << home.homeName() << "\".\n";
  home.homeName(argv[2]);
  if (!keeping.save(home)) {
    std::cerr << keeping.errDescription() << "\n";
    return 1;
  }
  QVSa::Home again;
  return again.connect(argv[1], "QVApp") && again.homeName() == argv[2] ? 0 : 1;
}
