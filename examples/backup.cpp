// Backs both databases up, and says when a nightly backup would come next.
//   backup SERVER FOLDER

#include <QVSa/hosting/Backups.h>
#include <QVSa/maintenance/cSchedule.h>
#include <iostream>

int main(int argc, char** argv) {
  if (argc != 3) return 2;
  QVSa::Backups backups;
  backups.connect(argv[1]);
  if (!backups.backUp(argv[2])) {
    std::cerr << backups.errDescription() << "\n";
    return 1;
  }
  std::cout << backups.sysFile() << "\n" << backups.appFile() << "\n";

  QVSa::cSchedule nightly;
  nightly.cycleNum(1);
  nightly.timesOneDay(1);
  nightly.StartTime(*QVSa::Date::parse("02:00"));
  std::cout << nightly.GetNextTime(QVSa::Date(2026, 3, 1, 12)).text() << "\n";
}
