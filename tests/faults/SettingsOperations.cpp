#include "QVSa/QVSa.h"
#include "platform/Services.h"
#include "tests/faults/Shapes.h"
#include "tests/support/PlainSession.h"

namespace QVSa::test {

namespace {

// A directory that knows everybody, and a program in a folder without a place for pictures, while an operation runs.
template <class Body>
bool withDirectory(Body body) {
  platform::Services services = platform::services();
  services.getUsersFromLD = [](const platform::DirectoryQuery&, const String&, Integer&) { return String("found"); };
  services.programFolder = [] { return String("/dev/null"); };
  services.openSettings = [](const String&) { return nullptr; };
  const platform::Services before = platform::replaceServices(services);
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

void loadDora(User& user) { require(user.GetOne(3, "dora")); }

}  // namespace

std::vector<Operation> settingsOperations() {
  const auto save = [](Home& home) { return home.Save(); };
  return {
      on<Home>("Home.connect", [](auto& home, const Place& place) { return home.connect(place.server, "QVApp"); }),
      on<Home>("Home.getImage",
               [](auto& home, const Place& place) {
                 return withDirectory([&] { return home.getImage(place.server, "QVApp"); });
               }),
      on<Home>("Home.Save", atomic(), changeHome, save),
      on<Home>("Home.Save without pictures", atomic(), save),
      on<Home>("Home.roleGrpNum", [](auto& home) { return home.roleGrpNum() > 0; }),
      on<Home>("Home.outerUserNum", [](auto& home) { return home.outerUserNum() == 1; }),
      on<User>("User.Reg", {}, apply, [](auto& user) { return user.Reg("Sales"); }),
      on<User>("User.regAudit", atomic(), loadDora, [](auto& user) { return user.regAudit(true, "welcome"); }),
      on<User>("User.GetOne of a directory user",
               [](auto& user) { return withDirectory([&] { return user.GetOne(3, "lena", true, "right"); }); }),
  };
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
