#include "console/Console.h"

#include <cstdlib>
#include <iostream>
#include <new>

#include "QVSa/frame/ConnectionString.h"
#include "QVSa/frame/Version.h"
#include "QVSa/hosting/SafeTexts.h"
#include "QVSa/hosting/ServerAccess.h"
#include "QVSa/values/Failure.h"

namespace QVSa::console {

namespace {

constexpr const char* filePrefix = "file:";

String variable(const char* name) {
  const char* value = std::getenv(name);
  return value == nullptr ? "" : value;
}

void tellSetting(const String& name, const String& value) {
  try {
    setServerAccess(name, value);
  } catch (const Failure& failure) {
    throw CLI::ValidationError(failure.description());
  }
}

String dump(const Json& document) { return document.dump(2, ' ', false, Json::error_handler_t::replace); }

}  // namespace

String ownFolder() {
  const String data = variable("XDG_DATA_HOME");
  return (data.empty() ? variable("HOME") + "/.local/share" : data) + "/qvsa";
}

std::optional<String> folderOf(const String& server) {
  const String name = serverOnly(server);
  if (name.rfind(filePrefix, 0) != 0) return std::nullopt;
  return name.substr(String(filePrefix).size());
}

Console::Console() : app_("Manages the organisation, its people, their sessions and its numbers.", "qvsa") {
  app_.set_version_flag("--version", String("qvsa ") + version());
  app_.require_subcommand(1);
  app_.fallthrough();
  app_.add_option("--server", place_.server, "\"file:FOLDER\" of an embedded installation, or a host[,port][|password]")
      ->envname("QVSA_SERVER")
      ->default_str("file:" + ownFolder());
  app_.add_option("--database", place_.database, "The database to work in")->capture_default_str();
  addServerSettings();
  app_.add_flag("--json", json_, "One JSON document in place of the text");
}

void Console::addServerSettings() {
  for (const ServerSetting& setting : serverAccessNames())
    app_.add_option_function<String>(
            "--" + setting.name, [name = setting.name](const String& value) { tellSetting(name, value); },
            setting.meaning)
        ->group("SQL Server");
}

void Console::command(CLI::App* subcommand, std::function<Answer()> run) {
  subcommand->callback([this, run = std::move(run)] { run_ = run; });
}

int Console::main(int argc, char** argv) {
  try {
    app_.parse(argc, argv);
    if (place_.server.empty()) place_.server = filePrefix + ownFolder();
    if (!isPlainName(place_.database)) throw Misuse("The name of a database is letters, digits and _.");
    const Answer answer = run_();
    print(answer);
    return answer.exitCode;
  } catch (const CLI::ParseError& error) {
    return app_.exit(error) == 0 ? 0 : 2;
  } catch (const Misuse& misuse) {
    std::cerr << "qvsa: " << misuse.what() << "\n";
    return 2;
  } catch (const Refusal& refusal) {
    return refuse(refusal.what(), refusal.number());
  } catch (const Failure& failure) {
    return refuse(failure.description(), failure.number());
  } catch (const std::bad_alloc&) {
    return refuse("Out of memory", number::memory);
  } catch (const std::exception& error) {
    return refuse(error.what(), 0);
  }
}

void Console::print(const Answer& answer) const {
  if (json_) {
    std::cout << dump(answer.document) << "\n";
  } else {
    std::cout << answer.text;
  }
}

int Console::refuse(const String& description, Long number) const {
  if (json_) {
    const Json text = number == 0 ? Json() : Json(numberText(number));
    std::cout << dump({{"error", {{"number", text}, {"description", description}}}}) << "\n";
  } else {
    std::cerr << "qvsa: " << description << (number == 0 ? "" : " (" + numberText(number) + ")") << "\n";
  }
  return 1;
}

}  // namespace QVSa::console
