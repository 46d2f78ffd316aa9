#include <filesystem>
#include <memory>

#include "QVSa/identity/User.h"
#include "QVSa/syslog/LogRecords.h"
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
  Long page = 1;
  Long pageSize = 25;
  String function;
  String description;
  String record;
  String item;
  String file;
  bool all = false;
};

constexpr Integer byLogin = 3;

Long idOf(const Console& console, const String& login) {
  User user;
  console.connect(user);
  require(user.GetOne(byLogin, login), user);
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
  require(log.Add(user, options.type, options.function, options.description, "", &options.record, &options.item,
                  &options.templates),
          log);
  return {"The entry is written.\n", {{"written", true}}};
}

// The record set's columns by their position, as their names follow the language.
std::vector<Json> rowOf(Recordset& rows) {
  std::vector<Json> values;
  for (const int column : {0, 1, 2, 3, 4, 5, 6, 7, 8, 10, 11}) values.push_back(rows[column].asText());
  return values;
}

Answer page(LogRecords& log, const Options& options) {
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
  const Long count = log.Count();
  const Long pages = (count + options.pageSize - 1) / options.pageSize;
  Recordset& rows = log.recordset();
  const std::int64_t before = (std::int64_t{options.page} - 1) * options.pageSize;
  for (std::int64_t i = 0; i < before && !rows.EOF_(); ++i) rows.MoveNext();
  for (Long i = 0; i < options.pageSize && !rows.EOF_(); ++i, rows.MoveNext()) table.row(rowOf(rows));
  const String place = "Page " + std::to_string(options.page) + " of " + std::to_string(pages) + ", " +
                       std::to_string(count) + (count == 1 ? " entry" : " entries") + " in all.\n";
  return {count == 0 ? "There are no such entries.\n" : table.text() + "\n" + place,
          {{"entries", table.document()}, {"count", count}, {"page", options.page}, {"pages", pages}}};
}

Answer list(const Console& console, const Options& options) {
  const Long user = options.user.empty() ? 0 : idOf(console, options.user);
  LogRecords log;
  console.connect(log);
  require(log.GetAll(options.type, day(options.from), day(options.to), user, options.templates, options.words), log);
  return page(log, options);
}

// The library puts the parts of users and templates into its statement as they are.
String quoted(const String& parts) {
  if (parts.rfind(',', 0) == 0) throw Misuse("A list can't begin with a comma.");
  return replaceAll(parts, "'", "''");
}

Answer query(const Console& console, const Options& options) {
  LogRecords log;
  console.connect(log);
  std::vector<Variant> values{day(options.from),    day(options.to),           options.computer,
                              quoted(options.user), quoted(options.templates), options.words};
  require(log.GetLogByQuery(values, options.type), log);
  return page(log, options);
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
  command->add_option("--page", options.page)->check(CLI::PositiveNumber)->capture_default_str();
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
