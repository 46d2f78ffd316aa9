#include <memory>

#include "QVSa/frame/ConnectionString.h"
#include "QVSa/frame/DeploymentSecrets.h"
#include "QVSa/identity/User.h"
#include "console/Commands.h"
#include "console/Passwords.h"
#include "console/Table.h"
#include "database/Scripts.h"
#include "providers/embedded/Installation.h"

namespace QVSa::console {

namespace {

constexpr const char* administrator = "Admin";
constexpr const char* administratorsJob = "1";

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

std::filesystem::path targetFolder(const Console& console, const Options& options) {
  if (!options.folder.empty()) return std::filesystem::absolute(options.folder).lexically_normal();
  const auto folder = folderOf(console.place().server);
  if (!folder)
    throw Misuse("An installation is made in a folder: name one, or a --server of the form \"file:FOLDER\".");
  return *folder;
}

void install(const std::filesystem::path& folder, const String& saPassword) {
  embedded::InstallationPlan plan;
  plan.folder = folder;
  plan.userPassword = defaultDbPwd();
  plan.adminPassword = saPassword;
  plan.scripts = {
      {"QVSys", String(database::qvSys)}, {"QVApp", String(database::qvApp)}, {"QVUpdate", String(database::qvUpdate)}};
  embedded::createInstallation(plan);
}

// The first row of the administrator is locked and without a password; his first save opens it.
void setAdministratorsPassword(const String& server, const Console& console, const String& password) {
  User user;
  require(user.connect(server, console.place().database), user);
  require(user.GetOne(3, administrator), user);
  user.Pwd(password);
  user.regState(0);
  user.setJobs(administratorsJob);
  require(user.Save(), user);
}

Answer answerOf(const String& server, const Chosen& admin, const Chosen& sa) {
  Sheet sheet;
  sheet.line("Server", "server", server);
  if (admin.madeUp) sheet.line("Password of Admin", "adminPassword", admin.password);
  if (sa.madeUp) sheet.line("Password of sa", "saPassword", sa.password);
  Answer answer;
  answer.document = sheet.document();
  answer.document["builtInSecrets"] = secrets::builtInSecrets;
  answer.text = "The installation is made.\n\n" + sheet.text();
  if (admin.madeUp || sa.madeUp) answer.text += "\nMade-up passwords are shown this once: note them down.\n";
  if (secrets::builtInSecrets)
    answer.text +=
        "\nThis build uses the deployment secrets that come with the source, which everybody knows. Build with a "
        "header of\n"
        "your own (QVSA_SECRETS_HEADER) before you keep anything here that is worth protecting.\n";
  answer.text += "\nPoint the console at it:  export QVSA_SERVER=\"" + server + "\"\n";
  return answer;
}

Answer init(const Console& console, const Options& options) {
  const auto folder = targetFolder(console, options);
  // The first two end a server text, the third the name of a file in the statement of a restore, and the last one parts
  // folders in the paths of backups.
  if (folder.string().find_first_of(";|'\\") != String::npos)
    throw Misuse("The path of an installation must hold none of ; | ' and \\.");
  if (embedded::isInstallation(folder)) throw Refusal("There is an installation in " + folder.string() + " already.");
  const Chosen admin = choose(administrator, options.makePasswords);
  const Chosen sa = choose("sa, the log-in that restores backups", options.makePasswords);
  if (sa.password.find(';') != String::npos) throw Misuse("The password of sa must hold no semicolon.");
  const String server = "file:" + folder.string();
  install(folder, sa.password);
  setAdministratorsPassword(server, console, admin.password);
  return answerOf(server, admin, sa);
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
