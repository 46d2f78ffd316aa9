// Adds a user and signs him on.
//   sign_on SERVER LOGIN PASSWORD

#include <QVSa/identity/Sessions.h>
#include <QVSa/identity/User.h>
#include <iostream>

int main(int argc, char** argv) {
  if (argc != 4) return 2;
  const QVSa::String login = argv[2];
  const QVSa::String password = argv[3];

  QVSa::User user;
  user.connect(argv[1], "QVApp");
  user.Login(login);
  user.Name(login);
  user.deptId("_root");
  user.Pwd(password);
  if (!user.Save()) {
    std::cerr << user.errDescription() << "\n";
    return 1;
  }

  QVSa::String session;
  if (!user.loginAuth(login, password, &session) || session.empty()) {
    std::cerr << user.errDescription() << "\n";
    return 1;
  }
  QVSa::Sessions sessions;
  sessions.connect(argv[1], "QVApp");
  for (const auto& each : sessions) std::cout << each->SessionId() << "  " << each->UserLogin() << "\n";
  return sessions.Terminate(session) ? 0 : 1;
}
