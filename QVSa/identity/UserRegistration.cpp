#include "QVSa/identity/User.h"
#include "QVSa/resources/Messages.h"
#include "QVSa/settings/Home.h"
#include "platform/Services.h"

namespace QVSa {
namespace {

constexpr const char* lineBreak = "\r\n";

}  // namespace

Boolean User::Reg(const String& deptName, const String& desc) {
  return operation(plain(), [&]() -> Boolean {
    if (isOuter_) {
      deptId_ = "_out";
    } else {
      deptId_ = "_root";
      // An inside applicant names his unit there.
      company_ = deptName;
    }
    uType_ = autoReg;
    regState_ = accountWaiting;
    Integer cycle = 0;
    if (!passesPolicy(Pwd_.text(), cycle)) return false;
    if (!insertUser()) return false;

    Connection connection = open();
    connection.Execute("set nocount on");
    insertRegInfo(connection, deptName, desc);
    if (!hasRegInfo(connection)) {
      Delete(Id_);
      fail("User", message::notRegistered);
    }
    Home home;
    // The application is stored whatever becomes of the mail.
    if (!home.connect(server(), DBName())) {
      note(home.errNumber(), home.errDescription());
    } else if (home.allowSMTP()) {
      const String administrator = administratorEmail(connection);
      if (!administrator.empty()) {
        queueMail(connection, administrator, fillMsg(LoadResString(1141), {company_, Name_}),
                  company_ + " - " + Name_ + lineBreak + desc);
      }
    }
    return true;
  });
}

void User::insertRegInfo(Connection& connection, const String& deptName, const String& desc) {
  connection.Execute(sql("insert into QVUserRegInfo"
                         "(UserId,isOuter,submitTime,Company,deptName,Email,telephone,MobilePhone,"
                         "address,zipcode,userDesc)"
                         " values(<UserId>,<isOuter>,<submitTime>,<Company>,<deptName>,<Email>,<telephone>,"
                         "<MobilePhone>,<address>,<zipcode>,<userDesc>)")
                         .number("UserId", Id_)
                         .number("isOuter", Long{isOuter_ ? 1 : 0})
                         .date("submitTime", platform::services().localTime())
                         .text("Company", company_)
                         .text("deptName", deptName)
                         .text("Email", Email_)
                         .text("telephone", telePhone_)
                         .text("MobilePhone", MobilePhone_)
                         .text("address", Address_)
                         .text("zipcode", zipcode_)
                         .text("userDesc", desc));
}

Boolean User::hasRegInfo(Connection& connection) {
  return !connection.Execute("select * from QVUserRegInfo where userId=" + text(Id_)).EOF_();
}

String User::administratorEmail(Connection& connection) {
  Recordset row = connection.Execute("select email from users where userlogin='Admin'");
  return row.EOF_() ? "" : row["email"].asText();
}

void User::queueMail(Connection& connection, const String& to, const String& subject, const String& body) {
  connection.Execute(sql(" insert into QVMailQ ( emType , emTo , emSubject , emBody ) "
                         " values ( 1 , <EmTo> , <EmSubject> , <EmBody>)")
                         .text("EmTo", to)
                         .text("EmSubject", subject)
                         .text("EmBody", body));
}

Boolean User::regAudit(Boolean pass, const String& desc, Long userId) {
  return operation(plain(), [&] {
    const Long id = userId == 0 ? Id_ : userId;
    Connection connection = open();
    connection.Execute("set nocount on");
    connection.BeginTrans();
    connection.Execute(sql("update users set accstate=<accstate> where userId=<userId>")
                           .number("accstate", Integer{pass ? accountNormal : accountRefused})
                           .number("userId", id));
    connection.Execute(sql("update QVUserRegInfo set checkTime=<checkTime>,noPassReason=<noPassReason>"
                           " where userId=<userId>")
                           .number("userId", id)
                           .date("checkTime", platform::services().localTime())
                           .text("noPassReason", desc));
    connection.CommitTrans();
    Home home;
    if (!home.connect(server(), DBName())) {
      note(home.errNumber(), home.errDescription());
    } else if (home.allowSendEmail()) {
      queueMail(connection, Email_, home.emailSubject(),
                (pass ? home.emailPContent() : home.emailRContent()) + lineBreak + desc);
    }
    return true;
  });
}

}  // namespace QVSa
