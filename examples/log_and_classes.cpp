// The system log and the classes of reports, step by step: entries are written, asked for, exported and cleared; a tree
// of classes is built, renamed and put in order. Run it on an installation whose log is empty:
//   log_and_classes file:FOLDER EXPORT_FILE
#include <filesystem>
#include <fstream>
#include <iostream>
#include <stdexcept>

#include "QVSa/classification/Directory.h"
#include "QVSa/syslog/LogRecords.h"

namespace {

using QVSa::Date;
using QVSa::Directory;
using QVSa::LogRecords;
using QVSa::Long;
using QVSa::String;

constexpr Long administrator = 1;

template <class Object>
void require(bool done, const Object& object) {
  if (!done) throw std::runtime_error(object.errDescription());
}

void showRows(LogRecords& log) {
  for (QVSa::Recordset& rows = log.recordset(); !rows.EOF_(); rows.MoveNext())
    std::cout << "  " << rows["logId"].asText() << "  " << rows[1].asText() << "  " << rows[2].asText() << "  "
              << rows[5].asText() << ": " << rows[6].asText() << "\n";
}

void writeAndAsk(LogRecords& log) {
  std::cout << "Three entries are written, each with a number of rule _log and the user's name of the moment.\n";
  const String record = "INV-0007";
  require(log.Add(administrator, 1, "Invoice", "Opened"), log);
  require(log.Add(administrator, 1, "Invoice", "Printed", "", &record), log);
  require(log.Add(administrator, 2, "Policy", "Changed"), log);

  std::cout << "\nThose of type 1, newest first; the rows stay when the connection is gone:\n";
  require(log.GetAll(1), log);
  std::cout << "  " << log.Count() << " rows, date columns " << log.dateCols() << ", hidden " << log.hiddenCols()
            << "\n";
  showRows(log);

  std::cout << "\nBy parts of names, for a web page, which gets a collection as well:\n";
  std::vector<QVSa::Variant> values{Date::empty(), Date::empty(), "", "adm,nobody", "", "print"};
  constexpr QVSa::Integer webPage = 2;
  require(log.GetLogByQuery(values, 1, "", 0, webPage), log);
  for (const auto& entry : log)
    std::cout << "  " << entry->operator_() << " " << entry->description() << " " << entry->rcId() << "\n";
}

void exportAndClear(LogRecords& log, const String& file) {
  const Long type = 1;
  const QVSa::Boolean backup = true;
  require(log.clearLog(&type, &backup, &file), log);
  std::cout << "\nType 1 is cleared, after an export of " << std::filesystem::file_size(file) << " bytes:\n";
  for (std::ifstream lines(file); lines;) {
    String line;
    std::getline(lines, line);
    if (line.size() > 1) std::cout << "  " << line.substr(0, line.size() - (line.back() == '\r' ? 1 : 0)) << "\n";
  }
}

Directory node(const String& server) {
  Directory made;
  require(made.connect(server, "QVApp"), made);
  return made;
}

void add(const String& server, const String& name, const String& superior) {
  Directory made = node(server);
  made.Class(name);
  made.superClass(superior);
  made.creUserId(administrator);
  require(made.Save(), made);
}

void buildTree(const String& server) {
  std::cout << "\nA tree of report classes is built; each row holds its ancestry as a path, a name and an order.\n";
  add(server, "Finance", "");
  add(server, "Sales", "");
  for (const char* name : {"Invoices", "Budgets"}) add(server, name, "Finance");
  add(server, "Open invoices", "Invoices");

  Directory renamed = node(server);
  require(renamed.GetOne(1, "Finance"), renamed);
  renamed.Class("Accounting");
  require(renamed.Save(), renamed);
  require(node(server).updateSubOrder("", "Accounting,Sales"), renamed);
  Directory leaf = node(server);
  require(leaf.GetOne(1, "Open invoices"), leaf);
  std::cout << "Finance is now Accounting, and stands first again. Far below it:\n  " << leaf.fullName() << "  "
            << leaf.ordPath() << "\n";
}

}  // namespace

int main(int argc, char** argv) {
  if (argc != 3) {
    std::cerr << "Call: log_and_classes SERVER EXPORT_FILE\n";
    return 2;
  }
  try {
    LogRecords log;
    require(log.connect(argv[1], "QVApp"), log);
    writeAndAsk(log);
    exportAndClear(log, argv[2]);
    buildTree(argv[1]);
    return 0;
  } catch (const std::exception& error) {
    std::cerr << error.what() << "\n";
    return 1;
  }
}
