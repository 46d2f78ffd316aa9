#include <filesystem>
#include <memory>

#include "QVSa/frame/ConnectionString.h"
#include "QVSa/hosting/Installation.h"
#include "QVSa/hosting/ServerInstallation.h"
#include "console/Commands.h"
#include "console/Passwords.h"
#include "console/Table.h"
#include "platform/PrivateFile.h"

namespace QVSa::console {

namespace {

struct Options {
  String folder;
  String login = "sa";
  String script;
  bool makePasswords = false;
};

// A password that was given, or one made up that is to be shown.
struct Chosen {
  String password;
  bool madeUp = false;
};

Chosen choose(const String& whose, bool makeUp) {
  const String given = makeUp ? "" : askNewPasswordOrNone("Password of " + whose + " (empty: make one up)");
  if (given.empty()) return {makePassword(), true};
  return {given, false};
}

String targetFolder(const Console& console, const Options& options) {
  if (options.folder.empty()) return *folderOf(console.place().server);
  return std::filesystem::absolute(options.folder).lexically_normal().string();
}

Answer answerOf(const String& server, const Chosen& admin, const Chosen& sa) {
  Sheet sheet;
  sheet.line("Server", "server", server);
  if (admin.madeUp) sheet.line("Password of Admin", "adminPassword", admin.password);
  if (sa.madeUp) sheet.line("Password of sa", "saPassword", sa.password);
  Answer answer;
  answer.document = sheet.document();
  answer.document["builtInSecrets"] = Installation::hasBuiltInSecrets();
  answer.text = "The installation is made.\n\n" + sheet.text();
  if (admin.madeUp || sa.madeUp) answer.text += "\nMade-up passwords are shown this once: note them down.\n";
  if (Installation::hasBuiltInSecrets())
    answer.text +=
        "\nThe deployment secrets are those that come with the source, which everybody knows. Make your own "
        "(qvsa secrets make),\n"
        "and the installation anew, before you keep anything here that is worth protecting.\n";
  answer.text += "\nPoint the console at it:  export QVSA_SERVER=\"" + server + "\"\n";
  return answer;
}

Answer initFolder(const Console& console, const Options& options) {
  const String folder = targetFolder(console, options);
  if (!Installation::canLieIn(folder)) throw Misuse("The path of an installation must hold none of ; | ' and \\.");
  if (!options.script.empty()) throw Misuse("A script is for a server: name it with --server.");
  if (Installation::isThere(folder)) throw Refusal("There is an installation in " + folder + " already.");
  const Chosen admin = choose("Admin", options.makePasswords);
  const Chosen sa = choose("sa, the log-in that restores backups", options.makePasswords);
  Installation installation;
  require(installation.make(folder, admin.password, sa.password), installation);
  return answerOf(Installation::serverOf(folder), admin, sa);
}

Answer initServer(const String& server, const Options& options) {
  ServerInstallation installation;
  if (installation.isComplete(server)) throw Refusal("There is an installation on " + serverOnly(server) + " already.");
  const String password = askPassword("Password of " + options.login + ", who may make databases and log-ins");
  const Chosen admin = choose("Admin", options.makePasswords);
  require(installation.make(server, options.login, password, admin.password), installation);
  return answerOf(server, admin, {});
}

// A script holds a password: nobody else may read it.
Answer writeScript(const String& path, const String& script, const String& next) {
  platform::makePrivateFile(path, script);
  return {"The script is written to " + path + ".\n" + next, {{"script", path}}};
}

Answer init(const Console& console, const Options& options) {
  const String& server = console.place().server;
  if (!options.folder.empty() || folderOf(server)) return initFolder(console, options);
  if (options.script.empty()) return initServer(server, options);
  return writeScript(options.script, ServerInstallation::script(server),
                     "It holds the password of QVUser. Run it as an administrator of the server, and `qvsa init` "
                     "afterwards: it sets the password of Admin.\n");
}

}  // namespace

void addInit(Console& console) {
  const auto options = std::make_shared<Options>();
  CLI::App* command = console.app().add_subcommand("init", "Make an installation, in a folder or on a SQL Server");
  command->add_option("folder", options->folder, "The folder; by default the one of --server");
  command->add_flag("--make-passwords", options->makePasswords, "Ask for no new password, make them up");
  command->add_option("--login", options->login, "Of a server: who makes it")->capture_default_str();
  command->add_option("--script", options->script, "Of a server: write it to this file as T-SQL, make nothing");
  console.command(command, [&console, options] { return init(console, *options); });

  CLI::App* upgrade = console.app().add_subcommand("upgrade", "Bring a server's databases to this release's layout");
  upgrade->add_option("--script", options->script, "The file that the steps are written to, as T-SQL")->required();
  console.command(upgrade, [options] {
    return writeScript(options->script, ServerInstallation::upgradeScript(),
                       "Run it as an administrator of the server. An embedded installation needs no such step.\n");
  });
}

}  // namespace QVSa::console
