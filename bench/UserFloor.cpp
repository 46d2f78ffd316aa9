#include "bench/UserFloor.h"

#include <stdexcept>

#include "platform/SecretMessage.h"

namespace QVSa::bench {

namespace {

std::vector<Row> rowsOf(Query& query) {
  std::vector<Row> rows;
  while (query.step()) rows.push_back(query.row());
  return rows;
}

// Places of the user's columns in a Row: texts and numbers are counted apart.
constexpr std::size_t userName = 0, userLogin = 1, storedPassword = 2, path = 3;
constexpr std::size_t userId = 0, deptId = 2;

}  // namespace

UserFloor::UserFloor(const Storage& storage)
    : numbers_(storage, "QVSys"),
      user_(storage,
            "select u.userId,u.userName,u.userLogin,u.userPwd,u.isAbstract,u.deptId,u.useSms,u.useKey,u.accstate,"
            "u.pwdDate,u.lgts,u.uType,d.isOrg,d.superDept,u.isOuter,u.synLogin,u.PwdNoChange,u.useOTPAuth,"
            "d.path,d.deptName,d.fullName,d.deptNo,u.mobilePhone,u.email,u.domain,u.company,u.address,u.zipcode,"
            "u.telephone,u.ldsName,u.ldDn,u.ipList,u.OTPTokenId "
            "from QVSys.users u join QVSys.departments d on u.deptId=d.deptId where u.userLogin=? and u.isRole=0"),
      organisation_(storage,
                    "select deptId,deptName,fullName,deptNo from QVSys.departments "
                    "where (?1 like '%'||path||'%' and isOrg=1 and deptId<>?2) or deptNo='_root' order by path desc"),
      roles_(storage,
             "select r.roleName from QVSys.userJob uj join QVSys.jobs j on uj.jobId=j.jobId "
             "join QVSys.roles r on j.roleId=r.roleId where uj.userId=? and r.builtIn=1"),
      groups_(storage, "select g.gName from QVSys.GrpUser x join QVSys.ItemGroups g on x.gId=g.gId where x.userId=?"),
      resetCounter_(storage, "update QVSys.users set lgts=0 where userId=?"),
      sessions_(storage, "select sesId,userLogin,computer,dbname,ip,begintime,moduName,lastActTime from QVSys.seslog"),
      policy_(storage, "select * from QVSys.saferule where id=1"),
      addSession_(storage,
                  "insert into QVSys.seslog(sesId,userLogin,computer,dbname,ip,begintime,lastActTime) "
                  "values(?1,?2,?3,'QVApp','',?4,?4)"),
      endSession_(storage, "delete from QVSys.seslog where sesId=?"),
      history_(storage, "select pwd,creDate from QVSys.userPwdHis where userId=? order by creDate desc limit 0"),
      update_(storage,
              "update QVSys.users set userName=?1,userLogin=?2,userPwd=?3,deptId=?4,mobilePhone='',email=?5,company='',"
              "address='',zipcode='',Telephone='',isOuter=0,useSms=0,useKey=0,accstate=0,pwdDate=?6,lockDate=null,"
              "ldsName='',ldDn='',ipList='',synLogin=0,PwdNoChange=0,useOTPAuth=0,OTPTokenId='' where userId=?7"),
      removeJobs_(storage, "delete from QVSys.userJob where userId=?"),
      addJobs_(storage,
               "insert into QVSys.userJob(userId,jobId) select ?1,jobId from QVSys.jobs where jobId in (?2,?3)"),
      removeGroups_(storage, "delete from QVSys.GrpUser where userId=?"),
      addGroup_(storage, "insert into QVSys.GrpUser(userId,gId) select ?1,gId from QVSys.ItemGroups where gName=?2"),
      begin_(storage, "begin"),
      commit_(storage, "commit") {}

UserFloor::Loaded UserFloor::readUser(const std::string& login) {
  Loaded loaded;
  loaded.user = user_.start(login).one();
  loaded.password = platform::decryptText(loaded.user.texts[storedPassword], loaded.user.texts[userName]);
  loaded.organisation = organisation_.start(loaded.user.texts[path], loaded.user.numbers[deptId]).one();
  return loaded;
}

void UserFloor::readRights(Loaded& loaded) {
  loaded.roles = rowsOf(roles_.start(loaded.user.numbers[userId]));
  loaded.groups = rowsOf(groups_.start(loaded.user.numbers[userId]));
}

UserFloor::Loaded UserFloor::load(const std::string& login) {
  Loaded loaded = readUser(login);
  readRights(loaded);
  return loaded;
}

std::string UserFloor::signOn(const std::string& login, const std::string& password, const std::string& host) {
  Loaded loaded = readUser(login);
  if (loaded.password != password) throw std::runtime_error("The floor found another password.");
  resetCounter_.start(loaded.user.numbers[userId]).run();
  readRights(loaded);
  requireNoOtherHost(login, host);
  const Row policy = policy_.start().one();
  // The list is read anew before a session is added to it.
  requireNoOtherHost(login, host);
  const std::string id = numbers_.newId("_ses");
  addSession_.start(id, login, host, nowTicks()).run();
  return id;
}

void UserFloor::requireNoOtherHost(const std::string& login, const std::string& host) {
  constexpr std::size_t sessionLogin = 1, computer = 2;
  for (const Row& session : rowsOf(sessions_.start())) {
    if (session.texts[sessionLogin] == login && session.texts[computer] != host)
      throw std::runtime_error("The floor found a session elsewhere.");
  }
}

void UserFloor::endSession(const std::string& id) { endSession_.start(id).run(); }

void UserFloor::save(const Loaded& user, std::int64_t jobA, std::int64_t jobB, const std::string& group) {
  const std::int64_t id = user.user.numbers[userId];
  const std::string& name = user.user.texts[userName];
  policy_.start().one();
  history_.start(id).run();
  begin_.start().run();
  const std::string stored = platform::encryptText(user.password, name);
  update_
      .start(name, user.user.texts[userLogin], stored, user.user.numbers[deptId], "ann.miller@office.example",
             nowTicks(), id)
      .run();
  removeJobs_.start(id).run();
  addJobs_.start(id, jobA, jobB).run();
  removeGroups_.start(id).run();
  addGroup_.start(id, group).run();
  commit_.start().run();
}

}  // namespace QVSa::bench
