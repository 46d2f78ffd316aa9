// Writes an entry of the system log and shows those of its type.
//   log SERVER

#include <QVSa/syslog/LogRecords.h>
#include <iostream>

int main(int argc, char** argv) {
  if (argc != 2) return 2;
  constexpr QVSa::Long administrator = 1;
  constexpr QVSa::Long type = 3;

  QVSa::LogRecords log;
  log.connect(argv[1], "QVApp");
  if (!log.Add(administrator, type, "Sales report", "Printed") || !log.GetAll(type)) {
    std::cerr << log.errDescription() << "\n";
    return 1;
  }
  const QVSa::Long count = log.Count();
  for (QVSa::Recordset& rows = log.recordset(); !rows.EOF_(); rows.MoveNext())
    std::cout << rows[1].asText() << "  " << rows[6].asText() << "\n";
  return count > 0 ? 0 : 1;
}
