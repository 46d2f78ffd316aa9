#include "tests/support/Scene.h"

namespace QVSa {
namespace {

using Texts = std::vector<String>;

// An operation that writes texts of a stranger's.
struct Writer {
  String name;
  Texts tokens;                               // of its statements: first those of the texts, in their order
  std::function<String(const Texts&)> write;  // the error text, empty for a success
  String stored;                              // gives the texts as they lie in the table
};

class HostileTexts : public test::Scene {
 protected:
  template <class Class>
  static String saved(Class& object) {
    return object.Save() ? "" : object.errDescription() + " ";
  }

  static void fillUser(User& user, const Texts& texts) {
    user.Name(texts[0]);
    user.Login(texts[1]);
    user.MobilePhone(texts[2]);
    user.Email(texts[3]);
    user.company(texts[4]);
    user.Address(texts[5]);
    user.zipcode(texts[6]);
    user.telePhone(texts[7]);
    user.OTPTokenId(texts[8]);
    user.dn(texts[9]);
    user.ipList(texts[10]);
  }

  static void fillHome(Home& home, const Texts& texts) {
    using Setter = void (Home::*)(String);
    constexpr Setter setters[] = {&Home::homeName,     &Home::enName,        &Home::Address,       &Home::zipcode,
                                  &Home::Tel,          &Home::Fax,           &Home::Email,         &Home::website,
                                  &Home::bankName,     &Home::bankAccount,   &Home::taxNo,         &Home::jPerson,
                                  &Home::regPrompt,    &Home::emailSender,   &Home::emailAddress,  &Home::emailSubject,
                                  &Home::emailContent, &Home::emailPContent, &Home::emailRContent, &Home::smtpServer,
                                  &Home::ldServerName, &Home::ldHost,        &Home::ldBaseDN,      &Home::ldBindDN,
                                  &Home::LoginNewsUrl, &Home::attLimit,      &Home::loginTitle};
    auto text = texts.begin();
    for (const Setter set : setters) (home.*set)(*text++);
  }

  template <class Class>
  static void fillRole(Class& object, const Texts& texts) {
    object.creUserName(texts[1]);
    object.upduserName(texts[2]);
  }

  std::vector<Writer> writers();
};

std::vector<Writer> HostileTexts::writers() {
  const String userColumns =
      "userName,userLogin,mobilePhone,email,company,address,zipcode,Telephone,OTPTokenId,ldDn,ipList";
  const Texts userTokens{"userName",  "userLogin",  "mobilePhone", "email",   "company", "address", "zipcode",
                         "Telephone", "OTPTokenId", "ldDn",        "ipList",  "userPwd", "deptId",  "useSms",
                         "accState",  "uType",      "domain",      "ldsName", "isOuter", "synLogin"};
  const Texts departmentTokens{"deptNo",  "deptName", "superDept", "fullName", "isOrg",
                               "isOuter", "path",     "oldId",     "path_old", "fullName_old"};
  const Texts nodeTokens{"class",   "CreUName", "UpdUName", "superClass",  "fullName", "path",       "CreUId",
                         "UpdTime", "OrdNo",    "OrdPath",  "OtherCanUpd", "oldclass", "CreateTime", "ordPath"};
  return {
      {"User.Save, a new one", userTokens,
       [&](const Texts& texts) {
         auto user = connected<User>();
         fillUser(user, texts);
         return saved(user);
       },
       "select top 1 " + userColumns + " from users order by userId desc"},
      {"User.Save", userTokens,
       [&](const Texts& texts) {
         tables_.run("delete from users where userId>1 and userId<(select max(userId) from users)");
         auto user = connected<User>();
         user.GetOne(1, tables_.text("select max(userId) from users"));
         fillUser(user, texts);
         return saved(user);
       },
       "select top 1 " + userColumns + " from users order by userId desc"},
      {"User.Reg",
       {"Company", "deptName", "Email", "telephone", "MobilePhone", "address", "zipcode", "userDesc", "UserId",
        "submitTime", "isOuter"},
       [&](const Texts& texts) {
         auto user = connected<User>();
         fillUser(user, {"Applicant", texts[0] + texts[1], texts[4], texts[2], texts[0], texts[5], texts[6], texts[3],
                         "", "", ""});
         user.isOuter(true);
         return user.Reg(texts[1], texts[7]) ? "" : user.errDescription();
       },
       "select top 1 Company,deptName,Email,telephone,MobilePhone,address,zipcode,userDesc from QVUserRegInfo"
       " order by UserId desc"},
      {"User.Reg, the mail",
       {"EmTo", "EmSubject", "EmBody"},
       [&](const Texts& texts) {
         tables_.run("update users set email=N'" + replaceAll(texts[0], "'", "''") +
                     "' where userLogin='Admin' update homeinfo set smtpState=1 delete from QVMailQ");
         auto user = connected<User>();
         user.Name(texts[1]);
         user.Login("mailed " + texts[1]);
         user.isOuter(true);
         user.company("C");
         return user.Reg("", "remark:" + texts[2]) ? "" : user.errDescription();
       },
       "select emTo,substring(emSubject,charindex('[C] - [',emSubject)+7,len(emSubject)-charindex('[C] - "
       "[',emSubject)-7)"
       ",substring(emBody,charindex('remark:',emBody)+7,len(emBody)) from QVMailQ"},
      {"User.regAudit",
       {"noPassReason", "checkTime", "userId"},
       [&](const Texts& texts) {
         auto user = connected<User>();
         return user.regAudit(true, texts[0], 1) ? "" : user.errDescription();
       },
       "select noPassReason from QVUserRegInfo where UserId=1"},
      {"Sessions, by a sign-on",
       {"userLogin", "computer", "ip", "dbName", "sesId"},
       [&](const Texts& texts) {
         addUser(texts[0]);
         auto user = connected<User>();
         return user.loginAuth(texts[0], "right", nullptr, false, texts[2], texts[1]) ? "" : user.errDescription();
       },
       "select top 1 userLogin,computer,ip from seslog order by sesId desc"},
      {"Department.Save, a new one", departmentTokens,
       [&](const Texts& texts) {
         auto department = connected<Department>();
         department.Id(texts[0]);
         department.Name(texts[1]);
         return saved(department);
       },
       "select top 1 deptNo,deptName from departments order by deptId desc"},
      {"Department.Save, and what lies below", departmentTokens,
       [&](const Texts& texts) {
         auto department = connected<Department>();
         department.GetOne(3, tables_.text("select superDept from departments where deptNo='below'"));
         department.Id(texts[0]);
         department.Name(texts[1]);
         return saved(department);
       },
       "select d.deptNo,left(below.fullName,len(below.fullName)-len('-below')) from departments d,departments below"
       " where below.deptNo='below' and below.superDept=d.deptId"},
      {"Role.Save, a new one",
       {"roleName", "CreUName", "UpdUName", "roleDesc", "CreUId", "CreateTime", "OtherCanUpd"},
       [&](const Texts& texts) {
         auto role = connected<Role>();
         role.Name(texts[0]);
         role.description(texts[2]);
         fillRole(role, texts);
         return saved(role);
       },
       "select top 1 roleName,CreUName,roleDesc from roles order by roleId desc"},
      {"Role.Save",
       {"roleName", "CreUName", "UpdUName", "roleDesc", "UpdTime"},
       [&](const Texts& texts) {
         auto role = connected<Role>();
         role.GetOne(1, 6);
         role.Name(texts[0]);
         role.description(texts[2]);
         fillRole(role, texts);
         return saved(role);
       },
       "select roleName,CreUName,roleDesc from roles where roleId=6"},
      {"userGroup.Save",
       {"gName", "gDesc", "gId"},
       [&](const Texts& texts) {
         auto group = connected<userGroup>();
         group.Name("first");
         group.description(texts[1]);
         const String text = saved(group);
         group.Name(texts[0]);
         return text + saved(group);
       },
       "select top 1 gName,gDesc from ItemGroups order by gId desc"},
      {"Directory.Save, a new one", nodeTokens,
       [&](const Texts& texts) {
         tables_.run("delete from RptDirectory");
         auto node = connected<Directory>();
         node.Class(texts[0]);
         fillRole(node, texts);
         return saved(node);
       },
       "select class,CreUName,UpdUName from RptDirectory"},
      {"Directory.Save", nodeTokens,
       [&](const Texts& texts) {
         auto node = connected<Directory>();
         node.GetOne(1, tables_.text("select class from RptDirectory"));
         node.Class("changed " + texts[0]);
         node.Save();
         node.Class(texts[0]);
         fillRole(node, texts);
         return saved(node);
       },
       "select class,CreUName,UpdUName from RptDirectory"},
      {"Home.Save",
       {"name",         "enName",       "address",      "zipcode",       "tel",           "fax",        "email",
        "website",      "bankName",     "bankAccount",  "taxNo",         "JPerson",       "regPrompt",  "emailSender",
        "emailAddress", "emailSubject", "emailContent", "emailPContent", "emailRContent", "smtpServer", "ldsName",
        "ldHost",       "ldBaseDN",     "ldBindDN",     "LoginNewsUrl",  "attLimit",      "loginTitle", "emailPassword",
        "ldPasswd",     "smtpPort",     "smtpState",    "ldPort",        "SavePwd",       "useOTPAuth"},
       [&](const Texts& texts) {
         auto home = connected<Home>();
         fillHome(home, texts);
         home.emailPassword("of the mail");
         home.ldPasswd("abc");
         return saved(home);
       },
       "select companyName,companyEnName,address,zip,tel,fax,email,webUrl,bankName,bankAccount,taxNo,JPerson,regPrompt,"
       "emailSender,emailAddress,emailSubject,emailContent,emailPContent,emailRContent,smtpServer,ldsName,ldHost,"
       "ldBaseDN,ldBindDN,LoginNewsUrl,attLimit,loginTitle from homeinfo"},
      {"IdMgr.Save and newId",
       {"idName", "preFix", "rcId", "sesId", "newId", "ymd", "oldName"},
       [&](const Texts& texts) {
         tables_.run("delete from idDel");
         auto rule = connected<IdMgr>();
         rule.idName("first");
         rule.preFix(texts[1]);
         rule.numPlace(3);
         String text = saved(rule);
         rule.idName(texts[0]);
         text += saved(rule);
         return rule.newId(texts[0], "", -1, texts[2], texts[3]).empty() ? rule.errDescription() : text;
       },
       "select i.idName,r.preFix,i.rcId,i.sesId from idDel i,idRule r where r.idName=i.idName and "
       "i.theId=r.preFix+'001'"},
      {"LogRecords.Add",
       {"funcName", "desc", "rcId", "wiId", "rtId", "computer", "logId"},
       [&](const Texts& texts) {
         auto log = connected<LogRecords>();
         return log.Add(1, 1, texts[0], texts[1], "", &texts[2], &texts[3], &texts[4]) ? "" : log.errDescription();
       },
       "select top 1 FuncName,OpDesc,rcId,wiId,rtId from syslog order by logId desc"},
      {"BKPlan.Save",
       {"name", "path", "id", "wk", "schDesc", "startTime"},
       [&](const Texts& texts) {
         auto plan = connected<BKPlan>();
         plan.Name("first");
         const String text = saved(plan);
         plan.Name(texts[0]);
         plan.bkPath(texts[1]);
         return text + saved(plan);
       },
       "select top 1 t.taskName,b.path from tasks t,QVBkPlan b where b.taskId=t.taskId order by t.taskId desc"}};
}

// Each text holds the token of another one and a statement of its own; in turn every text meets every token.
TEST_F(HostileTexts, AreStoredAsTheyAre) {
  tables_.run(
      "insert into QVUserRegInfo(UserId) values(1)"
      "insert into departments(deptNo,deptName,superDept,fullName,path,isOrg,isOuter)"
      " values('first','first',0,'first','.70.',0,0)"
      "insert into departments(deptNo,deptName,superDept,fullName,path,isOrg,isOuter)"
      " select 'below','below',deptId,'first-below','.70.71.',0,0 from departments where deptNo='first'");
  for (const Writer& writer : writers()) {
    for (std::size_t shift = 0; shift < writer.tokens.size(); ++shift) {
      Texts texts;
      for (std::size_t i = 0; i < writer.tokens.size(); ++i)
        texts.push_back("<" + writer.tokens[(i + shift) % writer.tokens.size()] + ">')--");
      ASSERT_EQ(writer.write(texts), "") << writer.name << " " << texts[0];
      const String stored = tables_.text(writer.stored);
      texts.resize(static_cast<std::size_t>(std::ranges::count(stored, '|')) + 1);
      ASSERT_EQ(stored, join(texts, "|")) << writer.name;
    }
  }
}

TEST_F(HostileTexts, ATokenInACallersOwnSqlIsNone) {
  auto user = connected<User>();
  user.Name("1");
  user.Login("intruder");
  user.setJobs("<userName>");
  EXPECT_FALSE(user.Save()) << "job 1 is that of the administrators";
  auto log = connected<LogRecords>();
  std::vector<Variant> query{Date::empty(), Date::empty(), "", "<desc>", "", "%"};
  EXPECT_TRUE(log.Add(1, 1, "", ""));
  EXPECT_TRUE(log.GetLogByQuery(query, 1)) << log.errDescription();
  EXPECT_EQ(log.Count(), 0);
}

}  // namespace
}  // namespace QVSa
