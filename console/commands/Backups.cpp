#include "QVSa/hosting/Backups.h"

#include <memory>

#include "QVSa/maintenance/DBMgr.h"
#include "console/Commands.h"
#include "console/Passwords.h"
#include "console/ServerPath.h"
#include "console/Waiting.h"

namespace QVSa::console {

namespace {

struct Options {
  String folder;
  String login = "sa";
  bool lock = false;
};

Answer backUp(const Console& console, const Options& options) {
  const String lock = options.lock ? askNewPassword("Password that lifts the lock") : "";
  if (options.lock && lock.empty()) throw Misuse("A lock needs a password.");
  Backups backups;
  console.connect(backups);
  {
    const Waiting waiting("Backing up");
    require(backups.backUp(serverPath(console, options.folder), lock), backups);
  }
  bool locked = false;
  require(backups.isLocked(locked), backups);
  Answer answer{"Both databases are backed up and checked:\n  " + backups.sysFile() + "\n  " + backups.appFile() + "\n",
                {{"system", backups.sysFile()}, {"application", backups.appFile()}, {"locked", locked}}};
  if (locked)
    answer.text +=
        "The reports of the copy are locked, and so are those of the running system: `qvsa backup unlock`.\n";
  else if (options.lock)
    answer.text += "There is no lock: the system has no reports.\n";
  return answer;
}

Answer restore(const Console& console, const Options& options) {
  const String password = askPassword("Password of " + options.login);
  Backups backups;
  console.connect(backups);
  {
    const Waiting waiting("Restoring, as soon as everybody has left");
    require(backups.restore(serverPath(console, options.folder), password, options.login), backups);
  }
  return {"Both databases are restored. Whoever was signed on has to sign on again.\n",
          {{"system", backups.sysFile()}, {"application", backups.appFile()}, {"restored", true}}};
}

Answer unlock(const Console& console) {
  DBMgr manager;
  require(manager.decryptTmps(console.place().server, askPassword("Password of the lock")), manager);
  return {"There is no lock on the reports now.\n", {{"locked", false}}};
}

}  // namespace

void addBackups(Console& console) {
  const auto options = std::make_shared<Options>();
  CLI::App* group = console.app().add_subcommand("backup", "Back the databases up and restore them");
  group->require_subcommand(1);

  CLI::App* now = group->add_subcommand("now", "Back both databases up while everybody goes on working");
  now->add_option("folder", options->folder, "Where sys.bak and app.bak are written, on the database server")
      ->required();
  now->add_flag("--lock", options->lock, "Ask for a password without which the copy's reports stay hidden");
  console.command(now, [&console, options] { return backUp(console, *options); });

  CLI::App* back = group->add_subcommand("restore", "Replace both databases by a backup; waits for everybody to leave");
  back->add_option("folder", options->folder, "Where sys.bak and app.bak lie")->required();
  back->add_option("--login", options->login, "The administrator of the database server")->capture_default_str();
  console.command(back, [&console, options] { return restore(console, *options); });

  CLI::App* unlocking = group->add_subcommand("unlock", "Lift the lock of a restored copy");
  console.command(unlocking, [&console] { return unlock(console); });
}

}  // namespace QVSa::console
