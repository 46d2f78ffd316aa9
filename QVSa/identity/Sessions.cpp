#include "QVSa/identity/Sessions.h"

#include "QVSa/frame/ConnectionString.h"
#include "QVSa/numbering/IdMgr.h"
#include "platform/Services.h"

namespace QVSa {

Boolean Sessions::connect(const String& server, const String& DBName) {
  return operation(plain(), [&] {
    setServer(server);
    setDBName(DBName);
    setConnectionString(buildConnString(server, "", false));
    const Boolean listed = GetAll().toBoolean();
    return listed || errNumber() != number::memory;
  });
}

Integer Sessions::Count() const { return Variant(static_cast<Long>(items_.size())).toInteger(); }

Variant Sessions::Remove(const Variant& Index) {
  items_.remove(Index);
  return {};
}

Variant Sessions::GetAll() {
  return operation(prefixed(message::sessionsNotListed), [&] {
    items_.clear();
    Connection connection = open();
    for (Recordset row = connection.Execute("select * from sesLog"); !row.EOF_(); row.MoveNext()) {
      auto session = std::make_shared<Session>();
      session->SessionId_ = row["sesId"].asText();
      session->UserLogin_ = row["userlogin"].asText();
      session->ip_ = row["ip"].asText();
      session->Computer_ = row["computer"].asText();
      session->BeginTime_ = row["begintime"].asText();
      session->DBName_ = row["dbName"].asText();
      session->ModuName_ = row["moduName"].asText();
      session->LastActTime_ = row["lastActTime"].asText();
      items_.add(session, session->SessionId_);
    }
    return true;
  });
}

String Sessions::newSession(const String& userLogin, const String& computerName, const String& DBName,
                            const String& ip) {
  return operation(prefixed(message::sessionNotOpened), [&]() -> String {
    IdMgr numbers;
    const String id = numbers.newId("_ses", connectionString(), -1, "", "");
    if (id.empty()) return refuseAs(numbers);

    Connection connection = open();
    connection.Execute(sql("insert into seslog(sesId,userLogin,computer,dbname,ip) values"
                           "(<sesId>,<userLogin>,<computer>,<dbName>,<ip>)")
                           .text("ip", ip)
                           .text("dbName", DBName)
                           .text("computer", computerName.empty() ? platform::services().computerName() : computerName)
                           .text("userLogin", userLogin)
                           .text("sesId", id));
    return id;
  });
}

Boolean Sessions::Terminate(const String& SessionId) {
  return operation(prefixed(message::sessionNotClosed), [&] {
    Connection connection = open();
    connection.Execute(sql("delete from seslog where sesId=<sesId>").text("sesId", SessionId));
    if (!DBName().empty()) connection.Execute("use " + DBName());
    connection.Execute(sql("update QVIdDel set rcId=null,sesId=null,state=0"
                           " where sesId=<sesId>")
                           .text("sesId", SessionId));
    if (!DBName().empty()) connection.Execute("use QVSys");
    return true;
  });
}

Boolean Sessions::clearSessions(const String& id) {
  return operation(prefixed(message::sessionNotClosed), [&] {
    Connection connection = open();
    const String others = id.empty() ? "" : " where sesId<><id>";
    connection.Execute(sql("delete from seslog" + others).text("id", id));
    return true;
  });
}

Boolean Sessions::newAction(const String& Id, const String& server, Long&, const String&, Integer) {
  return operation(plain(), [&] {
    Connection connection;
    connection.Open(buildConnString(server, "", false));
    const Long found =
        connection.Execute(sql("select count(*) from sesLog where sesId=<sesId>").text("sesId", Id))[0].asLong();
    if (found == 0) return false;
    connection.Execute(sql("update sesLog set lastacttime=getdate() where sesId=<sesId>").text("sesId", Id));
    return true;
  });
}

}  // namespace QVSa
