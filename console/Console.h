#pragma once

#include <CLI/CLI.hpp>
#include <functional>
#include <optional>

#include "console/Answer.h"

namespace QVSa::console {

// Where the commands work. `server` is never empty once a command runs.
struct Place {
  String server;
  String database = "QVApp";
};

// The program: its options and commands, what is printed, and the exit code.
class Console {
 public:
  Console();
  Console(const Console&) = delete;
  Console& operator=(const Console&) = delete;

  CLI::App& app() { return app_; }
  const Place& place() const { return place_; }

  // What `subcommand` does. It runs once all options are read.
  void command(CLI::App* subcommand, std::function<Answer()> run);

  // 0 done, 1 refused, 2 called wrongly.
  int main(int argc, char** argv);

  // Connects an object of the library to the place.
  template <class Object>
  void connect(Object& object) const {
    require(object.connect(place_.server, place_.database), object);
  }

 private:
  void addServerSettings();
  void print(const Answer& answer) const;
  int refuse(const String& description, Long number) const;

  CLI::App app_;
  Place place_;
  bool json_ = false;
  std::function<Answer()> run_;
};

// The folder of the installation that a user has for himself.
String ownFolder();

// The folder behind a server text of the form "file:folder"; nothing for a server of another kind.
std::optional<String> folderOf(const String& server);

}  // namespace QVSa::console
