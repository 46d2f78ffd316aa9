#include "QVSa/settings/Home.h"
#include "QVSa/values/Text.h"
#include "console/Commands.h"
#include "console/Table.h"
#include "platform/DirectoryLookup.h"

namespace QVSa::console {

namespace {

String reasonOf(Integer status) {
  switch (status) {
    case platform::directoryUnreachable:
      return "The directory server does not answer, or this machine's directorySecurity is not understood.";
    case platform::directoryRefused:
      return "The directory server refuses the name or the password of the settings.";
    case platform::directoryDisabled:
      return "The settings use no directory.";
    default:
      return "The directory server can't search below the base of the settings.";
  }
}

Answer users(const Console& console) {
  Home home;
  console.connect(home);
  String items;
  const Integer status = home.getUsersFromLDS(items);
  if (status != platform::directoryDone) throw Refusal(reasonOf(status), status);
  Table table({{"Login", "login"}, {"Name", "name"}, {"E-mail", "email"}, {"Distinguished name", "dn"}});
  for (const String& line : split(items, '\n')) {
    const std::vector<String> values = split(line, '\t');
    if (values.size() == 4) table.row({values[1], values[2], values[3], values[0]});
  }
  return {table.text() + "\n" + counted(table.size(), "user") + "\n", table.document()};
}

}  // namespace

void addDirectory(Console& console) {
  CLI::App* group = console.app().add_subcommand("directory", "The directory server")->require_subcommand(1);
  CLI::App* command = group->add_subcommand("users", "The users below the base of the settings");
  console.command(command, [&console] { return users(console); });
}

}  // namespace QVSa::console
