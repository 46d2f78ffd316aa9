#include "QVSa/syslog/LogRecords.h"
#include "platform/CodePage.h"
#include "platform/NewFile.h"

namespace QVSa {
namespace {

constexpr std::size_t blockSize = 65'536;

String typeCondition(const Long* type) {
  return type != nullptr && *type >= 1 && *type <= 3 ? " where LogType =" + text(*type) : "";
}

void appendLine(String& block, Recordset& row) {
  static const char* const columns[] = {"LogTime",  "UserName", "UserLogin", "LogType",
                                        "Computer", "FuncName", "OpDesc"};
  for (const char* const& column : columns) {
    block += &column == columns ? "\r\n" : "\t";
    block += row[column].asText();
  }
}

void writeRows(Recordset& row, const String& path) {
  platform::NewFile file(path);
  String block;
  for (; !row.EOF_(); row.MoveNext()) {
    appendLine(block, row);
    if (block.size() < blockSize) continue;
    file.write(platform::toAnsi(block).bytes);
    block.clear();
  }
  file.write(platform::toAnsi(block).bytes);
  file.keep();
}

}  // namespace

Boolean LogRecords::saveLog(const String& vBakFile, const Long* vLogType) {
  return operation(prefixed(message::logNotExported), [&] {
    items_.clear();
    Connection connection = openAtClient();
    Recordset rows;
    rows.Open("select * from syslog" + typeCondition(vLogType), connection, adOpenDynamic, adLockOptimistic);
    writeRows(rows, vBakFile);
    return true;
  });
}

Boolean LogRecords::clearLog(const Long* vLogType, const Boolean* vSaveBackup, const String* vBakFile) {
  return operation(prefixed(message::logNotCleared), [&] {
    items_.clear();
    Connection connection = openAtClient();
    if (vSaveBackup != nullptr && *vSaveBackup) saveLog(vBakFile == nullptr ? "" : *vBakFile, vLogType);
    connection.Execute(" delete from syslog  " + typeCondition(vLogType));
    return true;
  });
}

}  // namespace QVSa
