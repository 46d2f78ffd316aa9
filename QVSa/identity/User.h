#pragma once

#include "QVSa/frame/Frame.h"
#include "QVSa/frame/Password.h"
#include "QVSa/identity/UserTypes.h"

namespace QVSa {

class Department;
class Users;
class safeRule;

// One user with his department, organisation, built-in roles and groups; sign-on, the change of passwords, and the
// application for an account.
//   User user;  user.connect(server, "QVApp");
//   String session;  if (user.loginAuth("ann", password, &session)) ...
// A plain save removes the user's jobs and re-writes his password: give the jobs back by setJobs, and load him first.
class QVSA_EXPORT User : private Frame {
 public:
  using Frame::connect;
  using Frame::errDescription;
  using Frame::errNumber;

  // What GetOne finds a user by.
  enum Key : Integer { byId = 1, byName = 2, byLogin = 3 };

  // 0 while the user is not stored. Can be set once in the life of an object; later sets are ignored.
  Long Id() const { return Id_; }
  void Id(Long value);
  // The display name; the password is stored under it.
  String Name() const { return Name_; }
  void Name(String value) { Name_ = std::move(value); }
  String Login() const { return Login_; }
  void Login(String value) { Login_ = std::move(value); }
  // In clear; it can be set only.
  void Pwd(const String& value);
  String MobilePhone() const { return MobilePhone_; }
  void MobilePhone(String value) { MobilePhone_ = std::move(value); }
  String Email() const { return Email_; }
  void Email(String value) { Email_ = std::move(value); }
  Boolean builtIn() const { return builtIn_; }
  Boolean sendSms() const { return sendSms_; }
  void sendSms(Boolean value) { sendSms_ = value; }
  Boolean keyLogin() const { return keyLogin_; }
  void keyLogin(Boolean value) { keyLogin_ = value; }
  // An AccountState. Only accountNormal can sign on.
  Integer regState() const { return regState_; }
  void regState(Integer value) { regState_ = value; }
  Boolean locked() const { return regState_ == accountLocked; }
  // A userTypes; not changed by the save of a stored user, nor is Domain.
  Integer uType() const { return uType_; }
  void uType(Integer value) { uType_ = value; }
  // The Windows domain of an adUser.
  String Domain() const { return Domain_; }
  void Domain(String value) { Domain_ = std::move(value); }
  String company() const { return company_; }
  void company(String value) { company_ = std::move(value); }
  String Address() const { return Address_; }
  void Address(String value) { Address_ = std::move(value); }
  String zipcode() const { return zipcode_; }
  void zipcode(String value) { zipcode_ = std::move(value); }
  String telePhone() const { return telePhone_; }
  void telePhone(String value) { telePhone_ = std::move(value); }
  Boolean isOuter() const { return isOuter_; }
  void isOuter(Boolean value) { isOuter_ = value; }
  // The distinguished name of an ldapUser.
  String dn() const { return dn_; }
  void dn(String value) { dn_ = std::move(value); }
  // Addresses from which the user may sign on, "|" between: 192.168.1.7, 192.168.1.*, 192.168.1.10-20. Empty: any.
  String ipList() const { return ipList_; }
  void ipList(String value) { ipList_ = std::move(value); }
  // Whether the user may be signed on from several computers at once.
  Boolean synLogin() const { return synLogin_; }
  void synLogin(Boolean value) { synLogin_ = value; }
  // For the hosts; no operation here looks at the next three.
  Boolean PwdNoChange() const { return PwdNoChange_; }
  void PwdNoChange(Boolean value) { PwdNoChange_ = value; }
  Boolean useOTPAuth() const { return useOTPAuth_; }
  void useOTPAuth(Boolean value) { useOTPAuth_ = value; }
  String OTPTokenId() const { return OTPTokenId_; }
  void OTPTokenId(String value) { OTPTokenId_ = std::move(value); }

  // The department's inner id and its number.
  Long deptInnerId() const { return deptInnerId_; }
  void deptInnerId(Long value) { deptInnerId_ = value; }
  String deptId() const { return deptId_; }
  void deptId(String value) { deptId_ = std::move(value); }
  String deptName() const { return deptName_; }
  String deptFullName() const { return deptFullName_; }
  // The organisation above the user: his department itself, or the nearest above it.
  String orgId() const { return orgId_; }
  String orgName() const { return orgName_; }
  String orgFullName() const { return orgFullName_; }
  // Groups, comma-separated. A save takes it as the name of one group.
  String grpName() const { return grpName_; }
  void grpName(String value) { grpName_ = std::move(value); }
  String RegUserDesc() const { return RegUserDesc_; }
  void RegUserDesc(String value) { RegUserDesc_ = std::move(value); }

  // The built-in roles that the user holds through a job.
  Boolean isAdministrator() const { return isAdministrator_; }
  Boolean isDesigner() const { return isDesigner_; }
  Boolean isDeptadmin() const { return isDeptadmin_; }
  Boolean isProcAdmin() const { return isProcAdmin_; }
  Boolean isNoticeAdmin() const { return isNoticeAdmin_; }
  Boolean isOwner() const { return isOwner_; }
  // True after a full load.
  Boolean isUser() const { return isUser_; }
  // Days that the password has left, as loginAuth found it; -1 where it did not look. It ends at -32,768 and 32,767,
  // whatever lies beyond.
  Integer validDay() const { return validDay_; }

  // Loads by a Key; any other `keyName` finds nobody. userUnknown (0x8004044D) where there is no such user.
  // With `chkPwd` it tests `Pwd` and moves the counter of failed sign-ons, which may lock the account; a wrong password
  // shows in `wrongPwd` and is no failure of the load. `authLd`: the directory need only hold an ldapUser.
  // notInDirectory (0x8004046B) the directory does not know him.
  Boolean GetOne(Integer keyName, const Variant& keyValue, Boolean chkPwd = false, const String& Pwd = "",
                 Boolean* wrongPwd = nullptr, Boolean authLd = false);
  // Inserts or updates the user. Every save writes the password, restarts its validity and clears the date of a lock.
  // The update of a locked user unlocks him; any other state, and that of a new user, is written as it stands here. His
  // counter of failed sign-ons stays: the next wrong password locks him again, and until a right one in clear sets the
  // counter to 0, he reads as locked where none is asked in clear (levels 1 and above of loginAuth).
  // `passPwdCheck` leaves out the policy and the history of passwords: pass True where the password is not new.
  // userIncomplete (0x8004044E) name or login empty, passwordUsedBefore (0x80040460),
  // againstPolicy (0x80040BB8), 0x800A0BCD a new user's `deptId` is the number of no department.
  Boolean Save(Boolean passPwdCheck = false);
  // Deletes the user (0: this one). His jobs stay in the table.
  Boolean Delete(Long Id = 0);
  // The job ids for the next save, comma-separated: SQL of the caller's own, which goes into the statement as it is.
  Boolean setJobs(const String& jobList);
  Boolean setDept(const Department& dept);

  // The whole sign-on. `sI` receives the session id and is empty where none was opened. `ipAddr`: the computer's
  // addresses, "|" between; `hostName`: its name, empty for no test of other sessions. `userVerifyLevel`: 0 or below,
  // `Pwd` is the password; 1, its md5Hex; above, the host vouches for the user.
  // addressNotPermitted (0x8004046C), signedOnElsewhere (0x8004046D), lockedOut (0x8004045E) in any state but
  // accountNormal, passwordWrong (0x80040452), domainPasswordWrong (0x80040463), 0x80040E2F somebody else took the
  // number of a session at this moment (trying again is safe). True with passwordExpired (0x8004045F) and an empty
  // `sI`: the password has expired, only its change is allowed. errNumber is not cleared by a success: look at the
  // result, then at `sI`. Attempts at one account that run at the same moment each count for themselves and may all be
  // answered before the lock is written: a limit of 3 let 8 guesses at once through. A host that faces people makes
  // them one after the other. Throws Failure 6 on level 1 where the stored password has a character of two bytes in the
  // system's code page.
  Boolean loginAuth(const String& loginName, const String& Pwd, String* sI = nullptr, Boolean authLd = false,
                    const String& ipAddr = "", const String& hostName = "", const Integer* userVerifyLevel = nullptr);
  // Whether `pwdMd5` is the md5Hex of the user's password: no counter, no lock, no session. Throws as loginAuth does.
  Boolean loginAuth_1(const String& loginName, const String& pwdMd5);
  // Changes the password of the user that this object loaded or saved, under the policy. oldPasswordWrong (0x80040461)
  // `oldPwd` is not his, or there is no such user here: none was loaded, or his sign-on was refused. passwordUsedBefore
  // (0x80040460), againstPolicy (0x80040BB8).
  Boolean chgPwd(const String& oldPwd, const String& newPwd);
  // Sets the user's supervisor: whoever holds job `jobId` (`flag` 1), or user `userId` (2). Any other flag: none; both
  // ids are stored all the same. supervisorJobMissing (0x80040458) flag 1 without a job, supervisorUserMissing
  // (0x80040459) flag 2 without a user.
  Boolean setManager(Integer flag, Long jobId = 0, Long userId = 0);
  // True also where no supervisor was ever set: the arguments then stay as they are.
  Boolean getManager(Integer& flag, Long& jobId, Long& userId);
  // Who is supervised by this user or by a job that he holds: ids, names and logins, not connected. No object on
  // failure, two of one name among them.
  std::shared_ptr<Users> getSubUsers();
  // Applies for an account with the values of this object: stored as a user in state 2, who can't sign on before the
  // audit, with the rest in a row for the auditor; a mail to the administrator is queued. An outside user goes to
  // "_out", any other to "_root"; `deptName`, the unit that he names, then becomes his `company`. againstPolicy
  // (0x80040BB8) against the policy, userIncomplete (0x8004044E) name or login empty, notRegistered (0x8004046A) the
  // row was not stored. The user stays stored where a later step fails. Where the settings can't be read, no mail is
  // queued: True, with their failure in the error values.
  Boolean Reg(const String& deptName = "", const String& desc = "");
  // Accepts or refuses the application of `userId` (0: this user), in whatever state it is, and queues a mail to the
  // address that this object holds: load the user first. `desc` goes to him. Settings that can't be read: as for
  // Reg.
  Boolean regAudit(Boolean pass, const String& desc = "", Long userId = 0);
  // True for every text.
  Boolean chkRegPwd(const String& Pwd);
  // Records nothing and gives False.
  Boolean RecordAction(Long uid, const String& sId, String& s);

 private:
  friend class Users;

  struct Column;
  static const Column accountColumns[];
  static const Column furtherColumns[];
  struct Residence;

  void clearRecord();
  void clearRoles();
  void read(Recordset& row);
  // What the row of a list holds as well, and what of it is the user's own.
  void readAccount(Recordset& row);
  void readFurther(Recordset& row);
  void readColumn(const Column& column, const Field& field);
  SqlText withColumns(SqlText statement) const;
  void fillColumn(SqlText& statement, const Column& column) const;
  void findOrganisation(Connection& connection, const Residence& residence);
  void readRoles(Connection& connection);
  // `table` as the statement writes it.
  void readGroups(Connection& connection, const String& table);

  Boolean passesPolicy(const String& password, Integer& cycle);
  Boolean insertUser();
  Boolean updateUser();
  void findDepartment(Connection& connection);
  void insertRow(Connection& connection);
  void updateRow(Connection& connection, Integer state);
  Long insertedId(Connection& connection);
  void saveGroup(Connection& connection, Long id);
  String storedPwd() const;
  Boolean pwdUsedBefore(Integer cycle, const String& Pwd = "");
  void noteStored(String name);
  void pushPwdHistory(Integer cycle);

  Boolean testPassword(Connection& connection, const String& Pwd, Boolean* wrongPwd, Boolean authLd);
  void countFailure(Connection& connection);
  Boolean isWindowsUser(const String& Pwd) const;
  Boolean isInDirectory(Connection& connection, const String& Pwd, Boolean authLd);
  void ldapBind(const String& host, Long port, const Variant& bindDn, const String& password, String& dn, Boolean& ok);
  Boolean fromPermittedAddress(const String& ipAddr) const;
  Boolean isLockedOut(const safeRule& rule);
  Boolean isExpired(Integer maxDay);
  void writePwd(const String& newPwd);
  Boolean digestMatches(const String& digest) const;

  void insertRegInfo(Connection& connection, const String& deptName, const String& desc);
  Boolean hasRegInfo(Connection& connection);
  String administratorEmail(Connection& connection);
  void queueMail(Connection& connection, const String& to, const String& subject, const String& body);

  Long Id_ = 0;
  Boolean idGiven_ = false;
  String Name_;
  String Login_;
  StoredPassword Pwd_;
  String storedName_;         // the column userName, under which the stored password was encrypted
  Boolean isStored_ = false;  // what this object holds is a row of the table, read or written by it
  Boolean pwdChanged_ = false;
  String MobilePhone_;
  String Email_;
  Boolean builtIn_ = false;
  Boolean sendSms_ = false;
  Boolean keyLogin_ = false;
  Integer regState_ = accountNormal;
  Date pwdDate_;
  Long lgts_ = 0;
  Integer uType_ = Genaral;
  String Domain_;
  String company_;
  String Address_;
  String zipcode_;
  String telePhone_;
  Boolean isOuter_ = false;
  String ldsName_;
  String dn_;
  String ipList_;
  Boolean synLogin_ = false;
  Boolean PwdNoChange_ = false;
  Boolean useOTPAuth_ = false;
  String OTPTokenId_;
  Long deptInnerId_ = 0;
  String deptId_;
  String deptName_;
  String deptFullName_;
  String orgId_;
  String orgName_;
  String orgFullName_;
  String grpName_;
  String RegUserDesc_;
  Boolean isAdministrator_ = false;
  Boolean isDesigner_ = false;
  Boolean isDeptadmin_ = false;
  Boolean isProcAdmin_ = false;
  Boolean isNoticeAdmin_ = false;
  Boolean isOwner_ = false;
  Boolean isUser_ = false;
  Integer validDay_ = -1;
  String jobList_;
};

}  // namespace QVSa
