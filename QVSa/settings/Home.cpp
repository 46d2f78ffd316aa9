#include "QVSa/settings/Home.h"

#include "QVSa/frame/ConnectionString.h"
#include "QVSa/settings/MachineSettings.h"
#include "platform/Services.h"

namespace QVSa {
namespace {

// A column that must hold a number: NULL reads as an empty text, which is none.
Integer requiredNumber(const Field& column) { return Variant(column.asText()).toInteger(); }

}  // namespace

Boolean Home::connect(const String& server, const String& DBName) {
  if (!Frame::connect(server, DBName)) return false;
  return operation(plain(), [&] {
    clearDirectory();
    Connection connection = open();
    connection.Execute("set nocount on");
    {
      Recordset row = connection.Execute("select * from homeinfo where id=1");
      if (row.EOF_()) {
        clearRecord();
        return true;
      }
      read(row);
    }
    hasWorkFlow_ = false;
    Recordset row = connection.Execute("select count(*) from reptmps tmp,CFProcesses p where tmp.rtUid=p.rtUid ");
    if (!row.EOF_()) hasWorkFlow_ = row[0].asLong() > 0;
    return true;
  });
}

void Home::clearDirectory() {
  ldEnabled_ = 0;
  ldServerName_.clear();
  ldHost_.clear();
  LDPort_ = 389;
  ldBaseDN_.clear();
  ldBindDN_.clear();
  ldPasswd_ = Password();
}

void Home::clearRecord() {
  for (String* value : {&homeName_,      &enName_,       &Address_,      &zipcode_,        &Tel_,
                        &Fax_,           &Email_,        &website_,      &bankName_,       &bankAccount_,
                        &taxNo_,         &jPerson_,      &attLimit_,     &regPrompt_,      &smtpServer_,
                        &emailSender_,   &emailAddress_, &emailSubject_, &emailContent_,   &emailPContent_,
                        &emailRContent_, &LoginNewsUrl_, &loginTitle_,   &LoginImageFile_, &customFormIcon_}) {
    value->clear();
  }
  emailPassword_ = StoredPassword();
  AcctDay_ = acctTime_ = 1;
  timeOut_ = 0;
  SMIsOpen_ = false;
  allowOuter_ = allowRoleGrp_ = allowDomainUser_ = allowRegUser_ = false;
  allowSendEmail_ = true;
  hasWorkFlow_ = false;
  clearDirectory();
}

void Home::read(Recordset& row) {
  homeName_ = row["companyName"].asText();
  enName_ = row["companyEnName"].asText();
  Address_ = row["address"].asText();
  zipcode_ = row["zip"].asText();
  Tel_ = row["tel"].asText();
  Fax_ = row["fax"].asText();
  Email_ = row["email"].asText();
  website_ = row["webUrl"].asText();
  bankName_ = row["bankName"].asText();
  bankAccount_ = row["BankAccount"].asText();
  taxNo_ = row["TaxNo"].asText();
  jPerson_ = row["JPerson"].asText();
  AcctDay_ = requiredNumber(row["AcctDay"]);
  acctTime_ = requiredNumber(row["AcctTime"]);
  timeOut_ = row["timeOut"].asLong();
  SMIsOpen_ = row["smState"].isOne();
  attLimit_ = row["attLimit"].asText();
  savePwd_ = row["savePwd"].asLong();
  useOTPAuth_ = row["useOTPAuth"].isOne();
  allowOuter_ = row["allowOuter"].isOne();
  allowRoleGrp_ = row["roleGrp"].isOne();
  allowDomainUser_ = row["domainUser"].isOne();
  allowRegUser_ = row["autoRegUser"].isOne();
  regPrompt_ = row["regPrompt"].asText();
  readMail(row);
  readDirectory(row);
}

void Home::readMail(Recordset& row) {
  allowSendEmail_ = row["allowSendEmail"].isNull() || row["allowSendEmail"].isOne();
  smtpServer_ = row["smtpServer"].asText();
  smtpPort_ = row["smtpPort"].isNull() ? 25 : row["smtpPort"].asLong();
  emailSender_ = row["emailSender"].asText();
  emailAddress_ = row["emailAddress"].asText();
  emailSubject_ = row["emailSubject"].asText();
  emailContent_ = row["emailContent"].asText();
  emailPContent_ = row["emailPContent"].asText();
  emailRContent_ = row["emailRContent"].asText();
  emailPassword_ = StoredPassword::read(row["emailPassword"].asText(), smtpServer_);
  smtpState_ = row["smtpState"].asLong();
  smtpAuth_ = row["smtpAuth"].asInteger();
  smtpUseSSL_ = row["smtpUseSSL"].isOne();
}

void Home::readDirectory(Recordset& row) {
  ldEnabled_ = row["ldEnable"].asLong();
  if (ldEnabled_ != 1) return;
  ldServerName_ = row["LDSName"].asText();
  ldHost_ = row["LDHost"].asText();
  LDPort_ = row["LDport"].isNull() ? 389 : row["LDport"].asLong();
  ldBaseDN_ = row["LDBaseDN"].asText();
  ldBindDN_ = row["LDBindDN"].asText();
  ldPasswd_ = Password(unscrambleText(row["LDPasswd"].asText()));
}

Integer Home::roleGrpNum() { return count("select count(*) as num from ItemGroups"); }

Integer Home::outerUserNum() { return count("select count(*) as num from Users where isOuter=1"); }

Integer Home::count(const String& statement) {
  return operation(plain(), [&] {
    Connection connection = open();
    connection.Execute("set nocount on");
    return connection.Execute(statement)["num"].asInteger();
  });
}

Integer Home::getUsersFromLDS(String& items) {
  items.clear();
  if (ldEnabled_ == 0) return platform::directoryDisabled;
  return operation(plain(), Integer{platform::directoryFailed}, [&](Integer& result) {
    const auto& getUsersFromLD = platform::services().getUsersFromLD;
    const auto security = directorySecurity();
    if (!getUsersFromLD || !security) {
      result = platform::directoryUnreachable;
      return;
    }
    platform::DirectoryQuery query;
    query.host = ldHost_;
    query.port = LDPort_;
    query.bindDn = ldBindDN_;
    query.searchText = ldBaseDN_;
    query.security = *security;
    Integer status = 0;
    items = getUsersFromLD(query, ldPasswd_.text(), status);
    result = status;
  });
}

}  // namespace QVSa
