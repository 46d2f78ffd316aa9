// Makes an installation in a folder and signs its administrator on.
//   installation FOLDER PASSWORD

#include <QVSa/QVSa.h>
#include <iostream>

int main(int argc, char** argv) {
  if (argc != 3) return 2;
  const QVSa::String folder = argv[1];
  const QVSa::String password = argv[2];

  QVSa::Installation installation;
  if (!installation.make(folder, password, "of-sa-" + password)) {
    std::cerr << installation.errDescription() << "\n";
    return 1;
  }

  // What a host that strangers reach signs on by: one attempt at a login at a time.
  QVSa::SignOn entrance;
  entrance.connect(QVSa::Installation::serverOf(folder), "QVApp");
  entrance.signOn("Admin", "a guess");
  std::cout << "A guess: " << entrance.errDescription() << "\n";
  if (!entrance.signOn("Admin", password) || entrance.sessionId().empty()) {
    std::cerr << entrance.errDescription() << "\n";
    return 1;
  }
  std::cout << entrance.user().Name() << " is signed on, session " << entrance.sessionId() << "\n";
}
