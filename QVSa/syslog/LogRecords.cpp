#include "QVSa/syslog/LogRecords.h"

#include "QVSa/numbering/IdMgr.h"
#include "QVSa/resources/Messages.h"
#include "platform/Services.h"

namespace QVSa {
namespace {

String bracketed(Long messageId) { return "[" + LoadResString(messageId) + "]"; }

String valueOf(const String* optional) { return optional == nullptr ? "" : *optional; }

}  // namespace

LogRecords::LogRecords()
    : captions_{"logId",         bracketed(1705), bracketed(1706), bracketed(1707), bracketed(1708),
                bracketed(1709), bracketed(1710), bracketed(1714), bracketed(1715)} {}

Boolean LogRecords::Clear() {
  items_.clear();
  return false;
}

String LogRecords::computerName() const { return platform::services().computerName(); }

Connection LogRecords::openAtClient() const {
  Connection connection;
  connection.CursorLocation(adUseClient);
  connection.Open(connectionString());
  return connection;
}

Boolean LogRecords::Add(Long userId, Long LogType, const String& FuncName, const String& desc, const String&,
                        const String* rcId, const String* wiId, const String* rtId) {
  return operation(prefixedBlank(message::logNotWritten), [&] {
    IdMgr numbers;
    connectAlike(numbers);
    const String logId = numbers.newId("_log", "", -1, "", "");
    if (logId.empty()) throw Failure(numbers.errNumber(), "LogRecords", numbers.errDescription());

    Connection connection = openAtClient();
    connection.Execute(sql("insert into syslog(logId,logtype,UserId,LogTime,UserName,UserLogin,"
                           "computer,FuncName,OpDesc,rcId,wiId,rtId)"
                           " select <logId>," +
                           text(LogType) + "," + text(userId) +
                           ",getdate(),"
                           "userName,userLogin,<computer>,<funcName>,<desc>,<rcId>,<wiId>,<rtId>"
                           " from users where userId=" +
                           text(userId))
                           .text("logId", logId)
                           .text("computer", computerName())
                           .text("funcName", FuncName)
                           .text("desc", desc)
                           .text("rcId", valueOf(rcId))
                           .text("wiId", valueOf(wiId))
                           .text("rtId", valueOf(rtId)));
    return true;
  });
}

Long LogRecords::Count() { return recordset_.State() == 1 && !recordset_.EOF_() ? recordset_.RecordCount() : 0; }

}  // namespace QVSa
