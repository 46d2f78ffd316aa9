#include "tests/faults/SettingsOperations.h"

#include "QVSa/QVSa.h"
#include "platform/Services.h"
#include "tests/faults/Shapes.h"
#include "tests/support/PlainSession.h"

namespace QVSa::test {

namespace {

// A directory that knows everybody, and a program in a folder without a place for pictures, while an operation runs.
template <class Body>
bool withDirectory(Body body) {
  const platform::Services before = platform::services();
  platform::Services services = before;
  services.getUsersFromLD = [](const platform::DirectoryQuery&, const String&, Integer&) { return String("found"); };
  services.programFolder = [] { return String("/dev/null"); };
  services.openSettings = [](const String&) { return nullptr; };
  platform::replaceServices(services);
  const bool result = body();
  platform::replaceServices(before);
  return result;
}

void changeHome(Home& home) {
  home.homeName("Renamed");
  home.LoginImageFile("/proc/self/cmdline");
}

void apply(User& user) {
  user.Name("Cleo");
  user.Login("cleo");
  user.Pwd("right");
  user.Email("cleo@example.org");
}

std::vector<Operation> homeOperations() {
  return {
      operation<Home>("Home.connect", nothing<Home>,
                      [](Home& home, const String& server) { return home.connect(server, "QVApp"); }),
      operation<Home>("Home.getImage", nothing<Home>,
                      [](Home& home, const String& server) {
                        return withDirectory([&] { return home.getImage(server, "QVApp"); });
                      }),
      operation<Home>(
          "Home.Save", changeHome, [](Home& home, const String&) { return home.Save(); }, {}, true),
      operation<Home>(
          "Home.Save without pictures", nothing<Home>, [](Home& home, const String&) { return home.Save(); }, {}, true),
      operation<Home>("Home.roleGrpNum", nothing<Home>,
                      [](Home& home, const String&) { return home.roleGrpNum() > 0; }),
      operation<Home>("Home.outerUserNum", nothing<Home>,
                      [](Home& home, const String&) { return home.outerUserNum() == 1; }),
  };
}

}  // namespace

std::vector<Operation> settingsOperations() {
  std::vector<Operation> result = homeOperations();
  result.push_back(operation<User>("User.Reg", apply, [](User& user, const String&) { return user.Reg("Sales"); }));
  result.push_back(operation<User>(
      "User.regAudit", [](User& user) { require(user.GetOne(3, "dora")); },
      [](User& user, const String&) { return user.regAudit(true, "welcome"); }, {}, true));
  result.push_back(operation<User>("User.GetOne of a directory user", nothing<User>, [](User& user, const String&) {
    return withDirectory([&] { return user.GetOne(3, "lena", true, "right"); });
  }));
  return result;
}

void fillSettings(const String& server) {
  PlainSession(server).run(
      "update homeinfo set smtpState=1,ldEnable=1,LDHost='box'"
      " update users set email='admin@example.org' where userLogin='Admin'"
      " insert into users(userName,userLogin,userPwd,isRole,deptId,uType,ldDn,isOuter,accstate)"
      " values('Lena','lena','',0,1,3,'cn=lena',1,0)");
  User dora;
  dora.connect(server, "QVApp");
  dora.Name("Dora");
  dora.Login("dora");
  dora.Pwd("right");
  require(dora.Reg());
}

}  // namespace QVSa::test
