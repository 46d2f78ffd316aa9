#include "QVSa/frame/ConnectionString.h"
#include "QVSa/settings/Home.h"

namespace QVSa {
namespace {

Long one(Boolean value) { return value ? 1 : 0; }

void rollBack(Connection& connection) {
  try {
    connection.RollbackTrans();
  } catch (const Failure&) {
    // What made the save fail is the failure to report; closing discards the transaction as well.
  }
}

}  // namespace

Boolean Home::Save() {
  return operation(plain(), [&] {
    Connection connection = open();
    connection.Execute("set nocount on");
    connection.BeginTrans();
    try {
      write(connection);
      connection.CommitTrans();
    } catch (...) {
      rollBack(connection);
      throw;
    }
    return true;
  });
}

void Home::write(Connection& connection) {
  const Boolean exists = !connection.Execute("select id from Homeinfo where Id=1").EOF_();
  connection.Execute(filled(exists ? updateText() : insertText()));
  connection.Execute(sql("update Departments set "
                         " deptName=<name>,fullName=<name>"
                         " where deptNo='_root'")
                         .text("name", homeName_));
  sendPicture(connection, LoginImageFile_, " update homeinfo set LoginImage = null where id = 1 ",
              "select LoginImage from homeinfo where id = 1 ");
  sendPicture(connection, customFormIcon_, " update homeinfo set CustomFormIcon = null where id = 1 ",
              "select customFormIcon from homeinfo where id = 1 ");
}

// Nothing fills its token <zip>, so the server refuses it: a row that is missing is not made here.
String Home::insertText() const {
  return "Insert HomeInfo([id],[companyName],[companyEnName],[Address],"
         "[Zip],[Tel],[Fax],[Email],[WebUrl],[BankName],[BankAccount],[TaxNo],"
         "[JPerson],[acctDay],[acctTime],timeOut,smState"
         " , ldEnable,ldsName,ldHost,ldPort,ldBaseDN,ldBindDN,ldPasswd "
         " , useOTPAuth "
         " , savePwd "
         " , attLimit "
         " , UpdTime , LoginNewsUrl "
         " , loginTitle "
         " ) values ( 1 , <name>,<enName>,<address>,<zip>,<tel>,<fax>,<email>,<website>,"
         "<bankName>,<bankAccount>,<taxNo>,<JPerson>," +
         text(AcctDay_) + "," + text(acctTime_) + "," + text(timeOut_) + "," + text(one(SMIsOpen_)) + " , " +
         text(ldEnabled_) +
         " , <ldsName>,<ldHost>,<ldPort>,<ldBaseDN>,<ldBindDN>,<ldPasswd>"
         " , <useOTPAuth> "
         " , <SavePwd> "
         " , <attLimit> "
         " , getdate() , <LoginNewsUrl> "
         " , <loginTitle> )";
}

String Home::updateText() const {
  return "  Update HomeInfo  "
         " set companyName=<name>,companyEnName=<enName>"
         ",address=<address>"
         ",zip=<zipcode>"
         ",tel=<tel>,fax=<fax>"
         ",email=<email>,webUrl=<website>"
         ",bankName=<bankName>,bankAccount=<bankAccount>"
         ",taxNo=<taxNo>,jperson=<JPerson>"
         ",acctDay=" +
         text(AcctDay_) + ",acctTime=" + text(acctTime_) + ",timeOut=" + text(timeOut_) +
         ",smstate=" + text(one(SMIsOpen_)) + ",allowOuter=" + text(one(allowOuter_)) +
         ",roleGrp=" + text(one(allowRoleGrp_)) + ",domainUser=" + text(one(allowDomainUser_)) +
         ",autoRegUser=" + text(one(allowRegUser_)) +
         ",regPrompt=<regPrompt>"
         ",allowSendEmail=" +
         text(one(allowSendEmail_)) +
         ",smtpServer=<smtpServer>,smtpPort=<smtpPort>"
         ",emailSender=<emailSender>"
         ",emailAddress=<emailAddress>"
         ",emailSubject=<emailSubject>"
         ",emailContent=<emailContent>"
         ",emailPContent=<emailPContent>"
         ",emailRContent=<emailRContent>"
         ",emailPassword=<emailPassword>"
         ",smtpState=<smtpState>"
         ",smtpAuth=" +
         text(smtpAuth_) + ",smtpUseSSL=" + text(one(smtpUseSSL_)) + ",ldEnable=" + text(ldEnabled_) +
         ",ldsName=<ldsName>"
         ",ldHost=<ldHost>"
         ",ldPort=<ldPort>"
         ",ldBaseDN=<ldBaseDN>"
         ",ldBindDN=<ldBindDN>"
         ",ldPasswd=<ldPasswd>"
         " , UpdTime = getdate() "
         " , LoginNewsUrl = <LoginNewsUrl> "
         " , attLimit = <attLimit> "
         " , savePwd = <SavePwd> "
         " , useOTPAuth = <useOTPAuth> "
         " , loginTitle = <loginTitle> "
         " where id=1";
}

SqlText Home::filled(const String& statement) {
  return sql(statement)
      .text("name", homeName_)
      .text("enName", enName_)
      .text("address", Address_)
      .text("zipcode", zipcode_)
      .text("tel", Tel_)
      .text("fax", Fax_)
      .text("email", Email_)
      .text("website", website_)
      .text("bankName", bankName_)
      .text("bankAccount", bankAccount_)
      .text("taxNo", taxNo_)
      .text("JPerson", jPerson_)
      .text("regPrompt", regPrompt_)
      .text("smtpServer", smtpServer_)
      .text("emailSender", emailSender_)
      .text("emailAddress", emailAddress_)
      .text("emailSubject", emailSubject_)
      .text("emailContent", emailContent_)
      .text("emailPContent", emailPContent_)
      .text("emailRContent", emailRContent_)
      .secret("emailPassword", emailPassword_.encrypted(trimRight(smtpServer_)))
      .text("ldsName", ldServerName_)
      .text("ldHost", ldHost_)
      .text("ldBaseDN", ldBaseDN_)
      .text("ldBindDN", ldBindDN_)
      .secret("ldPasswd", scrambleText(ldPasswd_.text()))
      .text("LoginNewsUrl", LoginNewsUrl_)
      .text("attLimit", attLimit_)
      .text("loginTitle", loginTitle_)
      .number("smtpPort", smtpPort_)
      .number("smtpState", smtpState_)
      .number("ldPort", LDPort_)
      .number("SavePwd", savePwd_)
      .number("useOTPAuth", one(useOTPAuth_));
}

}  // namespace QVSa
