#include <filesystem>
#include <memory>

#include "QVSa/hosting/Installation.h"
#include "console/Commands.h"
#include "console/Passwords.h"
#include "console/Table.h"

namespace QVSa::console {

namespace {

struct Options {
  String folder;
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
  if (!options.folder.empty()) return std::filesystem::absolute(options.folder).lexically_normal().string();
  const auto folder = folderOf(console.place().server);
  if (!folder)
    throw Misuse("An installation is made in a folder: name one, or a --server of the form \"file:FOLDER\".");
  return *folder;
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

Answer init(const Console& console, const Options& options) {
  const String folder = targetFolder(console, options);
  if (!Installation::canLieIn(folder)) throw Misuse("The path of an installation must hold none of ; | ' and \\.");
  if (Installation::isThere(folder)) throw Refusal("There is an installation in " + folder + " already.");
  const Chosen admin = choose("Admin", options.makePasswords);
  const Chosen sa = choose("sa, the log-in that restores backups", options.makePasswords);
  Installation installation;
  require(installation.make(folder, admin.password, sa.password), installation);
  return answerOf(Installation::serverOf(folder), admin, sa);
}

}  // namespace

void addInit(Console& console) {
  const auto options = std::make_shared<Options>();
  CLI::App* command = console.app().add_subcommand("init", "Make an embedded installation in a folder");
  command->add_option("folder", options->folder, "The folder; by default the one of --server");
  command->add_flag("--make-passwords", options->makePasswords, "Ask for no password, make both up");
  console.command(command, [&console, options] { return init(console, *options); });
}

}  // namespace QVSa::console
