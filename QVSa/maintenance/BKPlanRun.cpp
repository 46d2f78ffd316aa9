#include <algorithm>
#include <limits>

#include "QVSa/maintenance/BKPlan.h"
#include "QVSa/maintenance/DBMgr.h"
#include "QVSa/numbering/IdMgr.h"
#include "QVSa/resources/Messages.h"
#include "QVSa/syslog/LogRecord.h"
#include "platform/Files.h"
#include "platform/Folders.h"
#include "platform/NewFile.h"
#include "platform/Services.h"

namespace QVSa {

namespace {

constexpr const char* sysFile = "sys.bak";
constexpr const char* appFile = "app.bak";
constexpr Long succeeded = 1;
constexpr Long failed = 2;

// Fourteen digits of date and time.
String stampOf(Date moment) {
  String digits = moment.sqlText();
  std::erase_if(digits, [](char c) { return c == ' ' || c == ':'; });
  return digits;
}

bool isStamp(const String& name) { return name.size() == 14 && name.find_first_not_of("0123456789") == String::npos; }

// What a killed run left half written.
void removeUnfinished(const String& folder) {
  for (const char* file : {sysFile, appFile}) platform::removeUnfinished(folder + "\\" + file);
}

// Backups modified before it are old.
Date limitOf(Date now, Integer number, Integer unit) {
  constexpr int daysOfWeek = 7;
  switch (unit) {
    case 0:
      return now.addDays(-number);
    case 1:
      return now.addDays(-number * daysOfWeek);
    case 2:
      return now.addMonths(-number);
    default:
      return {};
  }
}

Long following(Long schNo) {
  if (schNo == std::numeric_limits<Long>::max()) throw runtimeFailure(number::overflow);
  return schNo + 1;
}

bool holdsBackup(const String& folder) {
  const auto files = platform::filesIn(folder);
  return files.size() == 2 &&
         std::ranges::all_of(files, [](const String& name) { return name == sysFile || name == appFile; });
}

}  // namespace

Boolean BKPlan::exec(Long schNo) {
  return operation(plain(), [&]() -> Boolean {
    const Date now = platform::services().localTime();
    const String folder = bkPath_ + "\\" + stampOf(platform::services().localTime());
    if (bkPath_.empty()) throw runtimeFailure(number::noPath);
    if (!platform::folderExists(folder)) platform::makeFolder(folder);

    DBMgr manager;
    const Boolean done = manager.BackUpDB(server(), folder + "\\" + sysFile, folder + "\\" + appFile, "", "");
    if (!done) note(manager.errNumber(), LoadResString(message::backupFailed) + manager.errDescription());

    Connection connection = open();
    const Date next = schedule()->GetNextTime(now);
    connection.Execute(sql("update QVTaskSche set state=<state>,msg=<msg> where taskId=<id> and schNo=<schNo>")
                           .number("state", done ? succeeded : failed)
                           .text("msg", folder)
                           .number("id", Id_)
                           .number("schNo", schNo));
    connection.Execute(sql("insert into QVTaskSche(taskId,schNo,pTime) values(<id>,<schNo>,<pTime>)")
                           .number("id", Id_)
                           .number("schNo", following(schNo))
                           .date("pTime", next));
    if (delFiles_) clean(connection, now, folder);
    log(connection, done ? fillMsg(LoadResString(3106), {folder}) : errDescription());
    return done;
  });
}

void BKPlan::clean(Connection& connection, Date now, const String& ownFolder) {
  const Date limit = limitOf(now, delNum_, delUnit_);
  for (const String& name : platform::foldersIn(bkPath_)) {
    const String folder = bkPath_ + "\\" + name;
    if (folder == ownFolder) continue;
    const auto modified = platform::lastModified(folder);
    if (isStamp(name)) removeUnfinished(folder);
    if (!modified || *modified >= limit) continue;
    if (!isOwnBackup(connection, folder) || !holdsBackup(folder)) continue;
    platform::removeFolder(folder);
  }
}

Boolean BKPlan::isOwnBackup(Connection& connection, const String& folder) {
  Recordset row;
  row.Open(
      sql("select count(*) from QVTaskSche where taskId=<id> and msg = <path>").number("id", Id_).text("path", folder),
      connection);
  return row[0].asLong() > 0;
}

void BKPlan::log(Connection& connection, const String& opDesc) {
  IdMgr numbers;
  connectAlike(numbers);
  const String logId = numbers.newId("_log");
  if (logId.empty()) throw Failure(numbers.errNumber(), "BKPlan", numbers.errDescription());
  connection.Execute(sql("insert into SysLog("
                         " LogId,LogType,LogTime,userId,UserName,Computer,FuncName,OpDesc"
                         " )"
                         " values (<logId>,<logType>,getdate(),1,<userName>,<computer>,<funcName>,<opDesc>)")
                         .text("logId", logId)
                         .number("logType", administrationLog)
                         .text("userName", "")
                         .text("computer", platform::services().computerName())
                         .text("funcName", LoadResString(3105))
                         .text("opDesc", opDesc));
}

}  // namespace QVSa
