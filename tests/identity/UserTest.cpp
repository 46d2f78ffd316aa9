#include <algorithm>
#include <gtest/gtest.h>
#include <map>

#include "QVSa/frame/ConnectionString.h"
#include "QVSa/identity/User.h"
#include "QVSa/resources/Messages.h"
#include "platform/SecretMessage.h"
#include "platform/Services.h"
#include "tests/support/FakeSession.h"

namespace QVSa {
namespace {

using test::FakeServer;
using test::FakeTable;
using Log = std::vector<String>;

const char* const readAnn =
    "select u.userId,u.userName,u.userLogin,u.userPwd,u.mobilePhone,u.email,u.isAbstract,u.deptId,u.useSms,u.useKey,"
    "u.accstate,u.pwdDate,u.lgts,u.uType,u.domain,d.deptName,d.fullName,d.isOrg,d.superDept,d.deptNo,d.path,u.company,"
    "u.address,u.zipcode,u.telephone,u.isouter,u.ldsName,u.ldDn,u.ipList,u.synLogin , u.PwdNoChange  , u.useOTPAuth "
    " , u.OTPTokenId  from users u , departments d  where u.isRole = 0      and u.deptId = d.deptId  and "
    "userLogin=N'ann'";
const char* const readPolicy = "select * from saferule where id=1";
const char* const countFailure =
    "update u set lgts=lgts+1 from users u,saferule s where userId=5 and s.id=1 and s.lockErr=1";
const char* const lock =
    "update u set accstate=1,lockdate=getdate() from users u,safeRule s where s.id=1 and s.lockErr=1"
    " and u.userId=5 and u.accstate=0 and 3>=s.errTimes";

// Ann, password "right", two failed sign-ons so far, in a department that is its own organisation. Today is 7 March
// 2024.
class UserTest : public ::testing::Test {
 protected:
  UserTest() : services_(platform::services()) {
    platform::Services services = services_;
    services.localTime = [] { return Date(2024, 3, 7, 23, 0, 0); };
    platform::replaceServices(services);
    ann_ = {{"userId", Long{5}},      {"userName", "Ann"},
            {"userLogin", "ann"},     {"userPwd", platform::encryptText("right", "Ann")},
            {"accstate", Integer{0}}, {"pwdDate", Date(2024, 3, 1, 9, 0, 0)},
            {"lgts", Integer{2}},     {"uType", Integer{Genaral}},
            {"deptNo", "S"},          {"isOrg", Integer{1}},
            {"synLogin", Integer{1}}};
    answerPolicy(0, false);
    answer(
        "select r.roleName from userJob uj,jobs j,roles r where uj.userId=5 and uj.jobId=j.jobId and"
        " j.roleId=r.roleId and r.builtIn=1",
        "roleName", {"Dept Admin", "Report Owners"});
    answer("select g.gName from itemGroups g,grpUser x where x.userId=5 and x.gId=g.gId", "gName", {"one", "two"});
    answer("select * from sesLog", "sesId", {});
    user_.connect("host", "QVApp");
  }
  ~UserTest() override { platform::replaceServices(services_); }

  void answer(const String& statement, const char* column, const std::vector<Variant>& values) {
    FakeTable table{{{column}}, {}};
    for (const Variant& value : values) table.rows.push_back({value});
    server_.answer(statement, std::move(table));
  }
  void answerPolicy(Integer maxDay, Boolean lockErr) {
    server_.answer(readPolicy,
                   {{{"minLen"},
                     {"maxDay"},
                     {"charSet"},
                     {"cycle"},
                     {"lockExp"},
                     {"lockErr"},
                     {"errTimes"},
                     {"awa"},
                     {"sleepnn"},
                     {"awm"}},
                    {{Integer{0}, maxDay, "000", Integer{2}, false, lockErr, Integer{3}, false, Integer{0}, false}}});
  }
  Boolean signOn(const String& password) {
    FakeTable table{{}, {{}}};
    String columns(readAnn);
    columns = columns.substr(7, columns.find(" from users") - 7);
    for (const String& column : split(columns, ',')) {
      const String name = trim(column).substr(2);
      table.columns.push_back({name});
      table.rows[0].push_back(ann_.contains(name) ? ann_[name] : Variant::null());
    }
    server_.answer(readAnn, std::move(table));
    server_.log.clear();
    return user_.loginAuth("ann", password, &session_);
  }
  bool sent(const String& statement) const { return std::count(server_.log.begin(), server_.log.end(), statement) > 0; }

  template <class Package>
  static void replace(Package platform::Services::*member, Package package) {
    platform::Services services = platform::services();
    services.*member = std::move(package);
    platform::replaceServices(services);
  }

  platform::Services services_;
  FakeServer server_;
  std::map<String, Variant> ann_;
  User user_;
  String session_;
};

TEST_F(UserTest, APasswordClearsTheTextThatIsHandedOverToIt) {
  String given = "secret";
  EXPECT_EQ(Password(given).text(), "secret");
  EXPECT_EQ(given, "secret");
  const char* const memory = given.data();
  EXPECT_EQ(Password(std::move(given)).text(), "secret");
  // NOLINTNEXTLINE(clang-analyzer-cplusplus.InnerPointer): a short text lies in the object, which is still there
  EXPECT_EQ(String(memory, 6), String(6, '\0'));
}

TEST_F(UserTest, TheIdCanBeSetOnce) {
  User user;
  user.Id(3);
  user.Id(4);
  EXPECT_EQ(user.Id(), 3);
}

TEST_F(UserTest, ADomainAccountIsCountedAsAWrongPasswordWhereNoPackageAnswers) {
  ann_["uType"] = Integer{adUser};
  replace(&platform::Services::ntlmLogon, {});
  EXPECT_FALSE(signOn("right"));
  EXPECT_EQ(user_.errNumber(), messageNumber(1123));
  EXPECT_TRUE(sent(countFailure));
  EXPECT_TRUE(sent(lock));
  EXPECT_EQ(user_.Name(), "") << "the record is emptied";
}

TEST_F(UserTest, ADomainAccountIsAskedOfItsPackageAndNeverExpires) {
  ann_["uType"] = Integer{adUser};
  ann_["domain"] = "CORP";
  answerPolicy(1, false);
  replace(&platform::Services::ntlmLogon, {[](const String& user, const String& domain, const String& password) {
    return user == "ann" && domain == "CORP" && password == "theirs";
  }});
  answer("select preFix,ymdStyle,noStyle,reuseStyle,ymd=getdate() from idRule where idName=N'_ses'", "preFix", {});
  EXPECT_FALSE(signOn("theirs")) << "nothing but the number of the session is missing";
  EXPECT_EQ(user_.errNumber(), messageNumber(1502));
  EXPECT_EQ(user_.validDay(), -1);
  EXPECT_FALSE(sent(countFailure));
}

TEST_F(UserTest, ADirectoryAccountIsBoundAndMovesNoCounter) {
  ann_["uType"] = Integer{ldapUser};
  ann_["ldDn"] = "cn=ann";
  const String readDirectory =
      "select ldHost=isnull(ldHost,''),ldPort=isnull(ldPort,389),ldBaseDN=isnull(ldBaseDN,''),"
      "ldBindDN=isnull(ldBindDN,''),ldPasswd=isnull(ldPasswd,'') from homeInfo where id=1 and ldEnable=1";
  std::vector<String> asked;
  String users;
  replace(&platform::Services::getUsersFromLD, {[&](const platform::DirectoryQuery& query, const String& password,
                                                    Integer&) {
    asked.push_back(query.host + ":" + text(query.port) + " " + query.bindDn + " " + password + " " + query.searchText);
    return users;
  }});

  answer(readDirectory, "ldHost", {});
  EXPECT_FALSE(signOn("theirs")) << "no directory is enabled";
  EXPECT_EQ(user_.errNumber(), messageNumber(1131));
  EXPECT_EQ(server_.log, (Log{"open", "set nocount on", readAnn, readDirectory, "close"}));

  server_.answer(readDirectory, {{{"ldHost"}, {"ldPort"}, {"ldBaseDN"}, {"ldBindDN"}, {"ldPasswd"}},
                                 {{"box", Long{636}, "dc=x", "cn=service", scrambleText("abc")}}});
  EXPECT_FALSE(signOn("theirs")) << "nobody is found";
  EXPECT_FALSE(signOn("")) << "a bind without a password proves nothing";
  users = "somebody";
  EXPECT_FALSE(signOn(""));
  EXPECT_TRUE(signOn("theirs") || user_.errNumber() != messageNumber(1131));
  EXPECT_FALSE(sent("update users set lgts=0 where userId=5"));
  EXPECT_TRUE(user_.GetOne(3, "ann", true, "theirs", nullptr, true)) << "the service account asks";
  EXPECT_EQ(asked, (std::vector<String>{":0 cn=ann theirs cn=ann", "box:636 cn=ann theirs cn=ann",
                                        "box:636 cn=ann theirs cn=ann", "box:636 cn=service abc cn=ann"}));

  ann_["ldDn"] = Variant::null();
  EXPECT_FALSE(signOn("theirs")) << "nor does one without a name";
  EXPECT_TRUE(user_.GetOne(3, "ann", true, "", nullptr, true));
  EXPECT_EQ(asked.back(), "box:636 cn=service abc cn=service");
  replace(&platform::Services::getUsersFromLD, {});
  EXPECT_FALSE(signOn("theirs")) << "no package";
}

TEST_F(UserTest, AChangedPasswordJoinsTheHistoryBehindTheOldestThatIsKept) {
  signOn("right");
  const String history = "select top 2 isnull(pwd,''),creDate from userPwdHis where userId=5 order by creDate desc";
  answer(history, "", {platform::encryptText("earlier", "Ann")});
  answer("select top 1 creDate from userPwdHis where userId=5 order by creDate Desc", "creDate",
         {Date(2024, 2, 1, 10, 0, 0)});

  EXPECT_FALSE(user_.chgPwd("Right", "new"));
  EXPECT_EQ(user_.errNumber(), messageNumber(1121));
  EXPECT_FALSE(user_.chgPwd("right", "earlier"));
  EXPECT_EQ(user_.errDescription(), fillMsg(LoadResString(1120), {2}));

  server_.log.clear();
  EXPECT_TRUE(user_.chgPwd("right", "new"));
  EXPECT_TRUE(sent("delete from userPwdHis where userId=5 and creDate<'20240201 10:00:00'"));
  EXPECT_TRUE(
      sent("insert into userPwdHis(userId,creDate,pwd) select userId,pwdDate,userPwd from users where userId=5"));
  EXPECT_TRUE(user_.chgPwd("new", "newer")) << "the object holds the new password";
}

TEST_F(UserTest, ASaveThatRepeatsAPasswordIsRefusedBeforeAnythingIsWritten) {
  signOn("right");
  const String history = "select top 2 isnull(pwd,''),creDate from userPwdHis where userId=5 order by creDate desc";
  answer(history, "", {platform::encryptText("right", "Ann")});
  server_.log.clear();
  EXPECT_FALSE(user_.Save());
  EXPECT_EQ(user_.errDescription(), LoadResString(1120)) << "the place stays unfilled";
  EXPECT_EQ(server_.log, (Log{"open", readPolicy, "close", "open", history, "close"}));
}

TEST_F(UserTest, AnApplicantWithoutHisRowOfExtraDataIsDeletedAgain) {
  User applicant;
  applicant.connect("host");
  applicant.Name("Ben");
  applicant.Login("ben");
  server_.answer("select * from departments where deptNo=N'_root'",
                 {{{"deptId"}, {"deptName"}, {"fullName"}}, {{Long{1}, "Us", "Us"}}});
  answer("select scope_identity()", "", {Long{8}});
  answer("select * from QVUserRegInfo where userId=8", "UserId", {});
  EXPECT_FALSE(applicant.Reg());
  EXPECT_EQ(applicant.errNumber(), messageNumber(1130));
  EXPECT_EQ(applicant.errDescription(), LoadResString(1130));
  EXPECT_TRUE(sent("delete from users where userId=8"));
  EXPECT_EQ(server_.log.back(), "close") << "no settings are read and no mail is queued after it";
  for (const String& statement : server_.log) EXPECT_EQ(statement.find("QVMailQ"), String::npos);
}

TEST_F(UserTest, AnInsertTakesTheRootForNoDepartmentAndKeepsThePasswordUnderTheName) {
  User added;
  added.connect("host");
  EXPECT_FALSE(added.Save(true));
  EXPECT_EQ(added.errNumber(), messageNumber(1102));

  server_.answer("select * from departments where deptNo=N'_root'",
                 {{{"deptId"}, {"deptName"}, {"fullName"}}, {{Long{1}, "Group", "Group"}}});
  added.Name("Ben O'Hara");
  added.Login("ben");
  added.Pwd("secret");
  answer("select scope_identity()", "", {});
  EXPECT_FALSE(added.Save(true));
  EXPECT_EQ(added.errNumber(), messageNumber(1103));
  EXPECT_FALSE(sent("commit"));
  answer("select scope_identity()", "", {Long{8}});
  added.setJobs("1,4");
  added.grpName("one");
  server_.log.clear();
  ASSERT_TRUE(added.Save(true));
  EXPECT_EQ(added.Id(), 8);
  EXPECT_EQ(added.deptId(), "_root");

  ASSERT_EQ(server_.log.size(), 10U);
  const String& insert = server_.log[3];
  const String start =
      " insert into users ( userName , userLogin , userPwd , deptId , mobilePhone , email , isAbstract , "
      " isRole , useSms , useKey , company , address , zipcode , Telephone , isOuter , accState "
      " , PwdNoChange  , useOTPAuth  , OTPTokenId  , uType , Domain , ldsName , ldDn , ipList , synLogin ) "
      " values( N'Ben O''Hara' , N'ben' , N'";
  ASSERT_EQ(insert.substr(0, start.size()), start);
  const String stored = insert.substr(start.size(), insert.find('\'', start.size()) - start.size());
  EXPECT_EQ(platform::decryptText(stored, "Ben O'Hara"), "secret");
  EXPECT_EQ(insert.substr(start.size() + stored.size()),
            "' ,          1 , '' , '' , 0 , 0 , 0 , 0 ,          '' , '' , '' , '' , 0 , 0 ,          0 ,          0 , "
            "         '' ,          0 , '' , '' , '' , '' , 0 )");
  EXPECT_EQ(
      Log(server_.log.begin() + 4, server_.log.end()),
      (Log{"select scope_identity()",
           "insert into userJob(userId,jobId) select userId,jobId from users u,jobs j"
           " where u.userName=N'Ben O''Hara' and u.isRole=0 and jobId in (1,4)",
           "delete from grpUser where userId=8",
           "insert into grpUser(userId,gId) select 8, gId from ItemGroups where gName=N'one'", "commit", "close"}));
}

}  // namespace
}  // namespace QVSa
