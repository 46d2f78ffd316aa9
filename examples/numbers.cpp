// Makes a rule of numbers and issues two: "INV-260001" in the year 2026, and its successor.
//   numbers SERVER

#include <QVSa/hosting/Collisions.h>
#include <QVSa/numbering/IdMgr.h>
#include <iostream>

int main(int argc, char** argv) {
  if (argc != 2) return 2;
  QVSa::IdMgr rule;
  rule.connect(argv[1], "QVApp");
  rule.idName("invoice");
  rule.preFix("INV-");
  rule.DateFormat(QVSa::yy);
  rule.numPlace(4);
  if (!rule.Save()) {
    std::cerr << rule.errDescription() << "\n";
    return 1;
  }

  // Two callers of one moment collide, and one of them gets no number: he asks again.
  const auto next = [&] { return repeatCollided(rule, [&] { return rule.newId("invoice"); }); };
  const QVSa::String first = next();
  const QVSa::String second = next();
  std::cout << first << "\n" << second << "\n";
  return !first.empty() && first < second ? 0 : 1;
}
