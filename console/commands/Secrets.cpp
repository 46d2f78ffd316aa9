#include "QVSa/frame/Secrets.h"

#include <memory>

#include "QVSa/frame/ConnectionString.h"
#include "QVSa/hosting/SecretRotation.h"
#include "console/Commands.h"
#include "console/Passwords.h"
#include "console/Table.h"
#include "platform/PrivateFile.h"

namespace QVSa::console {

namespace {

struct Options {
  String file;
  String group;
};

Answer make(const Options& options) {
  const String file = options.file.empty() ? secretsFile() : options.file;
  if (file.empty()) throw Misuse("Name a file: QVSA_SECRETS is set to nothing.");
  platform::makePrivateFile(file, Secrets::madeUp().fileText(), options.group);
  return {"The secrets are made: " + file +
              "\nKeep a copy in a safe place. Installations of before want the secrets that they were made with.\n",
          {{"file", file}}};
}

struct Rotation {
  String newFile;
  bool restored = false;
};

Answer rotate(const Console& console, const Rotation& options) {
  SecretRotation rotation;
  if (!rotation.connect(console.place().server)) throw Refusal(rotation.errDescription(), rotation.errNumber());
  const String password = askPassword("Password of sa");
  require(
      options.restored ? rotation.rotateTexts(options.newFile, password) : rotation.rotate(options.newFile, password),
      rotation);
  Answer answer;
  answer.document = {{"moved", rotation.moved()}, {"unread", rotation.unread()}};
  answer.text = String(options.restored ? "" : "The log-in is moved, and ") +
                counted(static_cast<std::size_t>(rotation.moved()), "encrypted text") + " with it.\n";
  for (const String& name : rotation.unread()) answer.text += "Could not be read, and stays as it was: " + name + "\n";
  answer.text += "Put " + options.newFile + " in the place of the old secrets, and start the hosts anew.\n";
  return answer;
}

Answer scramble() {
  const String password = askNewPassword("Password");
  if (password.find(';') != String::npos) throw Misuse("A password in a server text holds no semicolon.");
  try {
    const String scrambled = scrambleText(password);
    return {scrambled + "\n", {{"scrambled", scrambled}}};
  } catch (const Failure& failure) {
    throw Refusal("This password can't be scrambled: choose another one.", failure.number());
  }
}

}  // namespace

void addSecrets(Console& console) {
  CLI::App* group =
      console.app()
          .add_subcommand("secrets", "The deployment secrets of this machine, and passwords in server texts")
          ->require_subcommand(1);
  const auto options = std::make_shared<Options>();
  CLI::App* makeCommand =
      group->add_subcommand("make", "Write a file of new secrets; an existing one is never touched");
  makeCommand->add_option("file", options->file, "The file; by default QVSA_SECRETS, else /etc/qvsa/secrets");
  makeCommand->add_option("--group", options->group, "A group that may read it: that of the accounts that run hosts");
  console.command(makeCommand, [options] { return make(*options); });

  const auto rotation = std::make_shared<Rotation>();
  CLI::App* rotateCommand =
      group->add_subcommand("rotate", "Move the installation from this machine's secrets to those of another file");
  rotateCommand->add_option("file", rotation->newFile, "The new secrets, as make writes them")->required();
  rotateCommand->add_flag("--restored", rotation->restored, "The texts alone, after a restore of an older backup");
  console.command(rotateCommand, [&console, rotation] { return rotate(console, *rotation); });

  CLI::App* scrambling = group->add_subcommand("scramble", "What stands behind the \"|\" of a server text");
  console.command(scrambling, [] { return scramble(); });
}

}  // namespace QVSa::console
