#include "QVSa/syslog/LogRecords.h"

#include "QVSa/syslog/LogRecord.h"
#include "bindings/c/Class.h"

namespace QVSa::binding {

void describe(Class<LogRecords>& log) {
  log.readOnly("dateCols", &LogRecords::dateCols)
      .readOnly("hiddenCols", &LogRecords::hiddenCols)
      .readOnly("recordset", &LogRecords::recordset)
      .readOnly("errNumber", &LogRecords::errNumber)
      .readOnly("errDescription", &LogRecords::errDescription)
      .operation("connect", {"server", optional("DBName", "")}, &LogRecords::connect, failsWith(false))
      .operation("Clear", {}, &LogRecords::Clear)
      .operation("computerName", {}, &LogRecords::computerName)
      .operation("Add", {"userId", "LogType", "FuncName", "desc", optional("SessionId", ""), "rcId", "wiId", "rtId"},
                 &LogRecords::Add, failsWith(false))
      .operation("GetAll",
                 {optional("LogType", 0), optional("startDate", Date::empty()), optional("endDate", Date::empty()),
                  optional("operator", 0), optional("rtId", ""), optional("desc", ""), optional("ordByFld", ""),
                  optional("ordBy", 0), optional("app", 0)},
                 &LogRecords::GetAll, failsWith(false))
      .operation("saveLog", {"vBakFile", "vLogType"}, &LogRecords::saveLog, failsWith(false))
      .operation("clearLog", {"vLogType", "vSaveBackup", "vBakFile"}, &LogRecords::clearLog, failsWith(false))
      .operation(
          "GetLogByQuery",
          {"arrList", optional("LogType", 0), optional("ordByFld", ""), optional("ordBy", 0), optional("app", 0)},
          &LogRecords::GetLogByQuery, failsWith(false))
      .operation("Item", {"vntIndexKey"}, &LogRecords::Item)
      .operation("Count", {}, &LogRecords::Count)
      .operation("Remove", {"vntIndexKey"}, &LogRecords::Remove)
      .operation("GetDataMember", {"DataMember"}, &LogRecords::GetDataMember)
      .items<LogRecord>();
}

}  // namespace QVSa::binding
