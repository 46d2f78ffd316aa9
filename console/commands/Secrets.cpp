#include "QVSa/frame/Secrets.h"

#include <memory>

#include "console/Commands.h"
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

}  // namespace

void addSecrets(Console& console) {
  CLI::App* group =
      console.app().add_subcommand("secrets", "The deployment secrets of this machine")->require_subcommand(1);
  const auto options = std::make_shared<Options>();
  CLI::App* makeCommand =
      group->add_subcommand("make", "Write a file of new secrets; an existing one is never touched");
  makeCommand->add_option("file", options->file, "The file; by default QVSA_SECRETS, else /etc/qvsa/secrets");
  makeCommand->add_option("--group", options->group, "A group that may read it: that of the accounts that run hosts");
  console.command(makeCommand, [options] { return make(*options); });
}

}  // namespace QVSa::console
