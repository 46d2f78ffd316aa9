#include <filesystem>
#include <memory>

#include "QVSa/hosting/Collisions.h"
#include "QVSa/hosting/LogPages.h"
#include "QVSa/identity/User.h"
#include "QVSa/syslog/LogRecords.h"
#include "QVSa/values/Text.h"
#include "console/Commands.h"
#include "console/Table.h"
#include "console/Waiting.h"
#include "platform/Files.h"

namespace QVSa::console {

namespace {

struct Options {
  Long type = 0;
  String from;
  String to;
  String user;
  String computer;
  String templates;
  String words;
  String after;
  Long pageSize = 25;
  String function;
  String description;
  String record;
  String item;
  String file;
  bool all = false;
};

Long idOf(const Console& console, const String& login) {
  User user;
  console.connect(user);
  require(user.GetOne(User::byLogin, login), user);
  return user.Id();
}

Date day(const String& text) {
  if (text.empty()) return Date::empty();
  const auto date = Date::parse(text);
  if (!date) throw Misuse("\"" + text + "\" is no date: yyyy-mm-dd");
  return *date;
}

Answer add(const Console& console, const Options& options) {
  const Long user = idOf(console, options.user.empty() ? "Admin" : options.user);
  LogRecords log;
  console.connect(log);
  require(repeatCollided(log,
                         [&] {
                           return log.Add(user, options.type, options.function, options.description, "",
                                          &options.record, &options.item, &options.templates);
                         }),
          log);
  return {"The entry is written.\n", {{"written", true}}};
}

Answer page(const Console& console, const LogFilter& filter, const Options& options) {
  LogPages log;
  console.connect(log);
  require(log.read(filter, options.pageSize, options.after), log);
  Table table({{"Entry", "entry"},
               {"Time", "time"},
               {"User", "user"},
               {"Computer", "computer"},
               {"Application", "application"},
               {"Operation", "operation"},
               {"Description", "description"},
               {"Template", "template"},
               {"Agent", "agent"},
               {"Record", "record"},
               {"Item", "item"}});
  for (const LogEntry& entry : log.entries())
    table.row({entry.id, entry.time.text(), entry.user, entry.computer, entry.application, entry.operation,
               entry.description, entry.templateName, entry.agent, entry.record, entry.item});
  const String more = log.next().empty() ? "There are no more.\n" : "More: add  --after " + log.next() + "\n";
  return {table.size() == 0 ? "There are no such entries.\n" : table.text() + "\n" + more,
          {{"entries", table.document()}, {"next", log.next().empty() ? Json() : Json(log.next())}}};
}

LogFilter filterOf(const Options& options) {
  LogFilter filter;
  filter.type = options.type;
  filter.from = day(options.from);
  filter.to = day(options.to);
  filter.words = options.words;
  return filter;
}

Answer list(const Console& console, const Options& options) {
  LogFilter filter = filterOf(options);
  if (!options.user.empty()) filter.userId = idOf(console, options.user);
  filter.templateId = options.templates;
  return page(console, filter, options);
}

Answer query(const Console& console, const Options& options) {
  LogFilter filter = filterOf(options);
  filter.computer = options.computer;
  filter.users = split(options.user, ',');
  filter.templates = split(options.templates, ',');
  return page(console, filter, options);
}

void exportTo(LogRecords& log, const Options& options) {
  const Waiting waiting("Exporting the log");
  require(log.saveLog(std::filesystem::absolute(options.file).string(), &options.type), log);
}

Answer exported(const Console& console, const Options& options) {
  LogRecords log;
  console.connect(log);
  exportTo(log, options);
  // A device or a pipe has no size.
  std::error_code hasNone;
  const auto bytes = std::filesystem::file_size(platform::localPath(options.file), hasNone);
  return {"The log is in " + options.file + (hasNone ? "" : ", " + std::to_string(bytes) + " bytes") + ".\n",
          {{"file", options.file}, {"bytes", hasNone ? Json() : Json(bytes)}}};
}

// Exported by itself first: the library would delete the entries whatever came of the export.
Answer clear(const Console& console, const Options& options) {
  if (options.all == (options.type != 0)) throw Misuse("Name a type, or --all.");
  LogRecords log;
  console.connect(log);
  if (!options.file.empty()) exportTo(log, options);
  const Waiting waiting("Clearing the log");
  require(log.clearLog(&options.type), log);
  return {"The log is cleared.\n", {{"cleared", options.all ? Json("all") : Json(options.type)}}};
}

void addPages(CLI::App* command, Options& options) {
  command->add_option("--type", options.type, "Type of the entries")->capture_default_str();
  command->add_option("--from", options.from, "First day, yyyy-mm-dd");
  command->add_option("--to", options.to, "Last day");
  command->add_option("--words", options.words, "Part of the description");
  command->add_option("--after", options.after, "Go on behind a page, at the place that it ends with");
  command->add_option("--page-size", options.pageSize, "Entries a page")
      ->check(CLI::Range(1, 100000))
      ->capture_default_str();
}

void addReading(Console& console, CLI::App* group, const std::shared_ptr<Options>& options) {
  CLI::App* listCommand = group->add_subcommand("list", "The entries of a type, newest first");
  addPages(listCommand, *options);
  listCommand->add_option("--user", options->user, "Login of the user");
  listCommand->add_option("--template", options->templates, "Id of the report template");
  console.command(listCommand, [&console, options] { return list(console, *options); });

  CLI::App* queryCommand = group->add_subcommand("query", "Entries by parts of names");
  addPages(queryCommand, *options);
  queryCommand->add_option("--computer", options->computer, "Part of the computer's name");
  queryCommand->add_option("--users", options->user, "Part of the user's name or login, or several, \",\" between");
  queryCommand->add_option("--templates", options->templates, "Part of the template's full name, or several");
  console.command(queryCommand, [&console, options] { return query(console, *options); });
}

}  // namespace

void addLog(Console& console) {
  const auto options = std::make_shared<Options>();
  CLI::App* group = console.app().add_subcommand("log", "The system log")->require_subcommand(1);

  CLI::App* addCommand = group->add_subcommand("add", "Write an entry");
  addCommand->add_option("function", options->function, "What was done it with")->required();
  addCommand->add_option("description", options->description)->required();
  addCommand->add_option("--user", options->user, "Login of who did it")->default_str("Admin");
  addCommand->add_option("--type", options->type, "Type of the entry")->capture_default_str();
  addCommand->add_option("--record", options->record, "Id of the record concerned");
  addCommand->add_option("--item", options->item, "A further id");
  addCommand->add_option("--template", options->templates, "Id of the report template");
  console.command(addCommand, [&console, options] { return add(console, *options); });

  addReading(console, group, options);

  CLI::App* exportCommand = group->add_subcommand("export", "Write the log to a text file, a line an entry");
  exportCommand->add_option("file", options->file)->required();
  exportCommand->add_option("--type", options->type, "One type alone")->check(CLI::Range(1, 3));
  console.command(exportCommand, [&console, options] { return exported(console, *options); });

  CLI::App* clearCommand = group->add_subcommand("clear", "Delete entries");
  clearCommand->add_option("--type", options->type, "One type alone")->check(CLI::Range(1, 3));
  clearCommand->add_flag("--all", options->all, "The entries of all types");
  clearCommand->add_option("--export", options->file, "A file to write them to first");
  console.command(clearCommand, [&console, options] { return clear(console, *options); });
}

}  // namespace QVSa::console
