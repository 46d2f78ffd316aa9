#include <filesystem>
#include <map>
#include <memory>
#include <optional>

#include "QVSa/hosting/HomeKeeping.h"
#include "console/Commands.h"
#include "console/Passwords.h"
#include "console/Switch.h"
#include "console/Table.h"
#include "console/commands/SettingsList.h"

namespace QVSa::console {

namespace {

// What is not given stays as it is.
struct Options {
  std::map<String, std::optional<String>> texts;
  std::map<String, std::optional<bool>> flags;
  std::map<String, std::optional<Integer>> shorts;
  std::map<String, std::optional<Long>> longs;
  std::optional<Long> directoryPort;
  bool mailPassword = false;
  bool directoryPassword = false;
  String loginImage;
  String icon;
  bool noLoginImage = false;
  bool noIcon = false;
  String folder = ".";
};

// The settings, with what has to come back unchanged from a save.
Home load(const Console& console, HomeKeeping& keeping) {
  console.connect(keeping);
  Home home;
  require(keeping.load(home), keeping);
  return home;
}

Answer shown(const Home& home) {
  Sheet sheet;
  for (const auto& setting : textSettings()) sheet.line(setting.label, setting.name, (home.*setting.get)());
  for (const auto& setting : shortSettings()) sheet.line(setting.label, setting.name, (home.*setting.get)());
  for (const auto& setting : longSettings()) sheet.line(setting.label, setting.name, (home.*setting.get)());
  for (const auto& setting : flagSettings()) sheet.line(setting.label, setting.name, (home.*setting.get)());
  sheet.line("Directory, port", "directory-port", home.LDPort());
  sheet.line("Picture of the login screen", "login-image", !home.LoginImageFile().empty());
  sheet.line("Icon", "icon", !home.customFormIcon().empty());
  return {sheet.text(), sheet.document()};
}

Answer show(const Console& console) {
  HomeKeeping keeping;
  return shown(load(console, keeping));
}

template <class Value>
void apply(Home& home, std::span<const Setting<Value>> settings, const std::map<String, std::optional<Value>>& given) {
  for (const auto& setting : settings) {
    const auto& value = given.at(setting.name);
    if (value) (home.*setting.set)(*value);
  }
}

void askPasswords(Home& home, const Options& options) {
  if (options.mailPassword) home.emailPassword(askNewPassword("Password for the mail server"));
  if (options.directoryPassword) home.ldPasswd(askNewPassword("Password for the directory"));
}

// A directory that is off is not loaded, so that whatever is set for it now would be gone with the next save.
void requireDirectoryOn(const Home& home, const Options& options) {
  bool given = options.directoryPassword || options.directoryPort;
  for (const char* name : {"directory-name", "directory-host", "directory-base", "directory-bind"})
    given = given || options.texts.at(name);
  if (given && !home.ldEnabled())
    throw Misuse("The settings of the directory are kept only while it is on: add --directory.");
}

void save(HomeKeeping& keeping, Home& home, const Options& options) {
  if (keeping.save(home)) return;
  constexpr Long cannotBeScrambled = 5;
  if (options.directoryPassword && keeping.errNumber() == cannotBeScrambled)
    throw Refusal("This password for the directory can't be stored (not every one can): choose another.", 5);
  require(false, keeping);
}

void setDirectoryPort(HomeKeeping& keeping, Long port) {
  if (!keeping.setDirectoryPort(port))
    throw Refusal("The settings are stored, the port is not: " + keeping.errDescription(), keeping.errNumber());
}

Answer set(const Console& console, const Options& options) {
  HomeKeeping keeping;
  Home home = load(console, keeping);
  apply(home, textSettings(), options.texts);
  apply(home, flagSettings(), options.flags);
  apply(home, shortSettings(), options.shorts);
  apply(home, longSettings(), options.longs);
  requireDirectoryOn(home, options);
  askPasswords(home, options);
  save(keeping, home, options);
  if (options.directoryPort) setDirectoryPort(keeping, *options.directoryPort);
  Answer answer = shown(load(console, keeping));
  answer.text = "The settings are stored.\n\n" + answer.text;
  return answer;
}

String localFile(const String& path) { return std::filesystem::absolute(path).string(); }

Answer setPictures(const Console& console, const Options& options) {
  HomeKeeping keeping;
  Home home = load(console, keeping);
  if (!options.loginImage.empty()) home.LoginImageFile(localFile(options.loginImage));
  if (!options.icon.empty()) home.customFormIcon(localFile(options.icon));
  if (options.noLoginImage) home.LoginImageFile("");
  if (options.noIcon) home.customFormIcon("");
  require(keeping.save(home), keeping);
  const Json document = {{"login-image", !home.LoginImageFile().empty()}, {"icon", !home.customFormIcon().empty()}};
  return {"The pictures are stored.\n", document};
}

Answer fetchPictures(const Console& console, const String& folder) {
  HomeKeeping keeping;
  console.connect(keeping);
  String loginImage, icon;
  require(keeping.fetchPictures(std::filesystem::absolute(folder).lexically_normal().string(), loginImage, icon),
          keeping);
  Sheet sheet;
  sheet.line("Picture of the login screen", "login-image", loginImage).line("Icon", "icon", icon);
  return {sheet.text(), sheet.document()};
}

template <class Value>
void addOptions(CLI::App* command, std::span<const Setting<Value>> settings,
                std::map<String, std::optional<Value>>& values) {
  for (const auto& setting : settings)
    command->add_option(String("--") + setting.name, values[setting.name], setting.label);
}

void addSet(Console& console, CLI::App* group, const std::shared_ptr<Options>& options) {
  CLI::App* command = group->add_subcommand("set", "Change settings; what is not named stays, the pictures too");
  addOptions(command, textSettings(), options->texts);
  addOptions(command, shortSettings(), options->shorts);
  addOptions(command, longSettings(), options->longs);
  for (const auto& setting : flagSettings())
    addSwitch(command, setting.name, options->flags[setting.name], setting.label);
  command->add_option("--directory-port", options->directoryPort, "Port of the directory; 636 and 3269 speak TLS")
      ->check(CLI::Range(1, 65535));
  command->add_flag("--mail-password", options->mailPassword, "Ask for the password of the mail server");
  command->add_flag("--directory-password", options->directoryPassword, "Ask for the password of the directory");
  console.command(command, [&console, options] { return set(console, *options); });
}

void addPictures(Console& console, CLI::App* group, const std::shared_ptr<Options>& options) {
  CLI::App* pictures = group->add_subcommand("pictures", "The pictures of the login screen")->require_subcommand(1);
  CLI::App* fetch = pictures->add_subcommand("fetch", "Bring LoginImage and formicon.ico to a folder");
  fetch->add_option("folder", options->folder)->check(CLI::ExistingDirectory);
  console.command(fetch, [&console, options] { return fetchPictures(console, options->folder); });

  CLI::App* send = pictures->add_subcommand("set", "Store pictures; what is not named stays");
  send->add_option("--login-image", options->loginImage, "File of the login screen's picture");
  send->add_option("--icon", options->icon, "File of the client windows' icon");
  send->add_flag("--no-login-image", options->noLoginImage, "Clear the picture");
  send->add_flag("--no-icon", options->noIcon, "Clear the icon");
  console.command(send, [&console, options] { return setPictures(console, *options); });
}

}  // namespace

void addSettings(Console& console) {
  const auto options = std::make_shared<Options>();
  CLI::App* group = console.app().add_subcommand("settings", "The company and its settings")->require_subcommand(1);
  CLI::App* showCommand = group->add_subcommand("show", "The settings as they are, without passwords");
  console.command(showCommand, [&console] { return show(console); });
  addSet(console, group, options);
  addPictures(console, group, options);
}

}  // namespace QVSa::console
