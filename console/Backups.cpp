#include <filesystem>
#include <memory>

#include "QVSa/maintenance/DBMgr.h"
#include "console/Commands.h"
#include "console/Passwords.h"
#include "console/ServerPath.h"
#include "console/SystemRows.h"
#include "console/Waiting.h"

namespace QVSa::console {

namespace {

struct Options {
  String folder;
  String login = "sa";
  bool lock = false;
};

struct Files {
  String sys;
  String app;
};

Files filesIn(const Console& console, const String& folder) {
  const String place = serverPath(console, folder);
  return {below(console, place, "sys.bak"), below(console, place, "app.bak")};
}

// The lock is written to the running system, where it stays and goes into every copy; without reports none is written.
bool isLocked(const Console& console) {
  return !systemRows(console, "select roleId from roles where roleId=4 and roleSpec like '_%'").empty();
}

Answer backUp(const Console& console, const Options& options) {
  const Files files = filesIn(console, options.folder);
  const String lock = options.lock ? askNewPassword("Password that lifts the lock") : "";
  if (options.lock && lock.empty()) throw Misuse("A lock needs a password.");
  DBMgr manager;
  {
    const Waiting waiting("Backing up");
    require(manager.BackUpDB(console.place().server, files.sys, files.app, "", lock), manager);
  }
  const bool locked = isLocked(console);
  Answer answer{"Both databases are backed up and checked:\n  " + files.sys + "\n  " + files.app + "\n",
                {{"system", files.sys}, {"application", files.app}, {"locked", locked}}};
  if (locked)
    answer.text +=
        "The reports of the copy are locked, and so are those of the running system: `qvsa backup unlock`.\n";
  else if (options.lock)
    answer.text += "There is no lock: the system has no reports.\n";
  return answer;
}

Answer restore(const Console& console, const Options& options) {
  const Files files = filesIn(console, options.folder);
  const String password = askPassword("Password of " + options.login);
  DBMgr manager;
  {
    const Waiting waiting("Restoring, as soon as everybody has left");
    require(manager.RestoreDB(console.place().server, files.sys, files.app, password, false, options.login), manager);
  }
  return {"Both databases are restored. Whoever was signed on has to sign on again.\n",
          {{"system", files.sys}, {"application", files.app}, {"restored", true}}};
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
