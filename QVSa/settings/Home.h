#pragma once

#include "QVSa/frame/Frame.h"
#include "QVSa/frame/Password.h"

namespace QVSa {

// The settings of an installation, one row: the company, accounting and time-outs, switches of sign-on and
// registration, the mail server and its letters, the directory server, the pictures of the login screen.
//   Home home;  home.connect(server);  home.homeName("Ours");  home.Save();
// Save writes everything as it stands here. Before it, call getImage too where pictures, title and news page shall
// stay: a Home that never fetched them clears them.
class QVSA_EXPORT Home : private Frame {
 public:
  using Frame::errDescription;
  using Frame::errNumber;

  // The company; the root department of the tree has the same name.
  String homeName() const { return homeName_; }
  void homeName(String value) { homeName_ = std::move(value); }
  String enName() const { return enName_; }
  void enName(String value) { enName_ = std::move(value); }
  String Address() const { return Address_; }
  void Address(String value) { Address_ = std::move(value); }
  String zipcode() const { return zipcode_; }
  void zipcode(String value) { zipcode_ = std::move(value); }
  String Tel() const { return Tel_; }
  void Tel(String value) { Tel_ = std::move(value); }
  String Fax() const { return Fax_; }
  void Fax(String value) { Fax_ = std::move(value); }
  String Email() const { return Email_; }
  void Email(String value) { Email_ = std::move(value); }
  String website() const { return website_; }
  void website(String value) { website_ = std::move(value); }
  String bankName() const { return bankName_; }
  void bankName(String value) { bankName_ = std::move(value); }
  String bankAccount() const { return bankAccount_; }
  void bankAccount(String value) { bankAccount_ = std::move(value); }
  String taxNo() const { return taxNo_; }
  void taxNo(String value) { taxNo_ = std::move(value); }
  String jPerson() const { return jPerson_; }
  void jPerson(String value) { jPerson_ = std::move(value); }
  // For the hosts; nothing in this library acts on these four and attLimit.
  Integer AcctDay() const { return AcctDay_; }
  void AcctDay(Integer value) { AcctDay_ = value; }
  Integer acctTime() const { return acctTime_; }
  void acctTime(Integer value) { acctTime_ = value; }
  Long timeOut() const { return timeOut_; }
  void timeOut(Long value) { timeOut_ = value; }
  Boolean SMIsOpen() const { return SMIsOpen_; }
  void SMIsOpen(Boolean value) { SMIsOpen_ = value; }
  // Of the login screen; read by getImage alone.
  String loginTitle() const { return loginTitle_; }
  void loginTitle(String value) { loginTitle_ = std::move(value); }
  // The file of the client windows' icon, not the icon: Save sends it, and clears the stored one where this is empty.
  String customFormIcon() const { return customFormIcon_; }
  void customFormIcon(String value) { customFormIcon_ = std::move(value); }
  Boolean useOTPAuth() const { return useOTPAuth_; }
  void useOTPAuth(Boolean value) { useOTPAuth_ = value; }
  // A stored number other than 1 reads False and stays in the row until this is set.
  Boolean SavePwd() const { return savePwd_ == 1; }
  void SavePwd(Boolean value) { savePwd_ = value ? 1 : 0; }
  String attLimit() const { return attLimit_; }
  void attLimit(String value) { attLimit_ = std::move(value); }
  // The file of the login screen's picture, as customFormIcon.
  String LoginImageFile() const { return LoginImageFile_; }
  void LoginImageFile(String value) { LoginImageFile_ = std::move(value); }
  // Read by getImage alone.
  String LoginNewsUrl() const { return LoginNewsUrl_; }
  void LoginNewsUrl(String value) { LoginNewsUrl_ = std::move(value); }

  // The directory server. While it is not enabled, a load leaves the rest of it empty, and a save then writes that.
  Boolean ldEnabled() const { return ldEnabled_ == 1; }
  void ldEnabled(Boolean value) { ldEnabled_ = value ? 1 : 0; }
  String ldServerName() const { return ldServerName_; }
  void ldServerName(String value) { ldServerName_ = std::move(value); }
  String ldHost() const { return ldHost_; }
  void ldHost(String value) { ldHost_ = std::move(value); }
  // It can't be set: the row decides, or else 389.
  Long LDPort() const { return LDPort_; }
  void LDPort(Long) {}
  String ldBaseDN() const { return ldBaseDN_; }
  void ldBaseDN(String value) { ldBaseDN_ = std::move(value); }
  String ldBindDN() const { return ldBindDN_; }
  void ldBindDN(String value) { ldBindDN_ = std::move(value); }
  // It can be set only. A save fails with 5 for one that scrambleText can't carry.
  void ldPasswd(const String& value) { ldPasswd_ = Password(value); }

  // Mail: the server, the sender, and the letters of self-registration (emailPContent for those accepted,
  // emailRContent for those refused). The password is stored under the server's name.
  String emailPassword() const { return emailPassword_.text(); }
  void emailPassword(const String& value) { emailPassword_ = StoredPassword(value); }
  Boolean allowSMTP() const { return smtpState_ == 1; }
  void allowSMTP(Boolean value) { smtpState_ = value ? 1 : 0; }
  String emailRContent() const { return emailRContent_; }
  void emailRContent(String value) { emailRContent_ = std::move(value); }
  String emailPContent() const { return emailPContent_; }
  void emailPContent(String value) { emailPContent_ = std::move(value); }
  String emailContent() const { return emailContent_; }
  void emailContent(String value) { emailContent_ = std::move(value); }
  String emailSubject() const { return emailSubject_; }
  void emailSubject(String value) { emailSubject_ = std::move(value); }
  String emailAddress() const { return emailAddress_; }
  void emailAddress(String value) { emailAddress_ = std::move(value); }
  String emailSender() const { return emailSender_; }
  void emailSender(String value) { emailSender_ = std::move(value); }
  String smtpServer() const { return smtpServer_; }
  void smtpServer(String value) { smtpServer_ = std::move(value); }
  Long smtpPort() const { return smtpPort_; }
  void smtpPort(Long value) { smtpPort_ = value; }
  Integer smtpAuth() const { return smtpAuth_; }
  void smtpAuth(Integer value) { smtpAuth_ = value; }
  Boolean smtpUseSSL() const { return smtpUseSSL_; }
  void smtpUseSSL(Boolean value) { smtpUseSSL_ = value; }
  Boolean allowSendEmail() const { return allowSendEmail_; }
  void allowSendEmail(Boolean value) { allowSendEmail_ = value; }

  // How many user groups and how many outside users there are, read at the call; 0 where it fails.
  Integer roleGrpNum();
  Integer outerUserNum();

  String regPrompt() const { return regPrompt_; }
  void regPrompt(String value) { regPrompt_ = std::move(value); }
  Boolean allowRegUser() const { return allowRegUser_; }
  void allowRegUser(Boolean value) { allowRegUser_ = value; }
  Boolean allowDomainUser() const { return allowDomainUser_; }
  void allowDomainUser(Boolean value) { allowDomainUser_ = value; }
  Boolean allowRoleGrp() const { return allowRoleGrp_; }
  void allowRoleGrp(Boolean value) { allowRoleGrp_ = value; }
  Boolean allowOuter() const { return allowOuter_; }
  void allowOuter(Boolean value) { allowOuter_ = value; }
  // Whether templates with workflow processes exist, as connect found it.
  Boolean hasWorkFlow() const { return hasWorkFlow_; }

  // Brings what the login screen shows to this machine: LoginNewsUrl and loginTitle into its settings store, where the
  // store has the key; the picture and the icon into the files "\LoginImage" and "\formicon.ico" of the program's
  // folder. A local file that is newer than the last save of the settings stays; one whose picture is gone is deleted.
  // LoginImageFile and customFormIcon then are the files' paths, or empty. A picture that can't be written, for a
  // folder of its name say, leaves its text in errDescription and is no failure.
  Boolean getImage(const String& server, const String& DBName = "");
  // Loads the settings. Without a row they get their defaults, and the result is True.
  Boolean connect(const String& server, const String& DBName = "");
  // Writes the settings, the root department's name and the pictures: all of it or nothing. A picture that can't be
  // read leaves its text in errDescription, and the rest is saved. Where the row is missing the server refuses the
  // statement.
  Boolean Save();
  // The directory's users as platform/DirectoryLookup.h tells, and its status as the result: 0 done, 1 unreachable, or
  // this machine's directorySecurity is not understood, 2 bind refused, 3 the directory is not enabled (nothing is
  // asked), 4 the search failed.
  Integer getUsersFromLDS(String& items);

 private:
  void clearDirectory();
  void clearRecord();
  void read(Recordset& row);
  void readMail(Recordset& row);
  void readDirectory(Recordset& row);
  Integer count(const String& statement);

  void write(Connection& connection);
  String insertText() const;
  String updateText() const;
  SqlText filled(const String& statement);
  void sendPicture(Connection& connection, const String& path, const String& clear, const String& select);

  void fetchText(const Field& column, const String& name, String& value);
  void fetchPicture(Recordset& row, const String& column, const String& path, String& file);

  String homeName_;
  String enName_;
  String Address_;
  String zipcode_;
  String Tel_;
  String Fax_;
  String Email_;
  String website_;
  String bankName_;
  String bankAccount_;
  String taxNo_;
  String jPerson_;
  Integer AcctDay_ = 0;
  Integer acctTime_ = 0;
  Long timeOut_ = 0;
  Boolean SMIsOpen_ = false;
  String attLimit_;
  Long savePwd_ = 0;
  Boolean useOTPAuth_ = false;
  Boolean allowOuter_ = false;
  Boolean allowRoleGrp_ = false;
  Boolean allowDomainUser_ = false;
  Boolean allowRegUser_ = false;
  String regPrompt_;
  Boolean allowSendEmail_ = false;
  String smtpServer_;
  Long smtpPort_ = 0;
  String emailSender_;
  String emailAddress_;
  String emailSubject_;
  String emailContent_;
  String emailPContent_;
  String emailRContent_;
  StoredPassword emailPassword_;
  Long smtpState_ = 0;
  Integer smtpAuth_ = 0;
  Boolean smtpUseSSL_ = false;
  Long ldEnabled_ = 0;
  String ldServerName_;
  String ldHost_;
  Long LDPort_ = 389;
  String ldBaseDN_;
  String ldBindDN_;
  Password ldPasswd_;
  String LoginNewsUrl_;
  String loginTitle_;
  String LoginImageFile_;
  String customFormIcon_;
  Boolean hasWorkFlow_ = false;
};

}  // namespace QVSa
