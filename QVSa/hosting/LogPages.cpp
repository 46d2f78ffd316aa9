#include "QVSa/hosting/LogPages.h"

#include <algorithm>
#include <cstdio>
#include <optional>

#include "QVSa/resources/Messages.h"

namespace QVSa {

namespace {

// The last entry of a page. Entries of one moment are told apart by their number.
struct Place {
  Date time;
  String id;

  static std::optional<Place> parse(const String& text) {
    const std::size_t mark = text.find('_');
    if (mark == String::npos) return std::nullopt;
    const auto time = Date::parse(text.substr(0, mark));
    return time ? std::optional(Place{*time, text.substr(mark + 1)}) : std::nullopt;
  }

  // As "20240307T10:00:00.123_24030700000001".
  String text() const { return stamp('T') + "_" + id; }
  // As the dialect reads it, exact to the unit of a datetime.
  String sqlTime() const { return stamp(' '); }

 private:
  String stamp(char separator) const {
    String text = time.sqlText();
    text[text.find(' ')] = separator;
    char milliseconds[8];
    std::snprintf(milliseconds, sizeof milliseconds, ".%03d", time.millisecond());
    return text + milliseconds;
  }
};

String applicationName(const Field& column) {
  constexpr Long firstName = 1711, known = 3;
  if (column.isNull()) return "Other";
  const Long application = column.asLong();
  return application >= 0 && application < known ? LoadResString(firstName + application) : "Other";
}

LogEntry entryOf(Recordset& row) {
  return {row[0].asText(),         row[1].asDate(), row[2].asText(),  row[3].asText(),
          applicationName(row[4]), row[5].asText(), row[6].asText(),  row[7].asText(),
          row[8].asText(),         row[9].asText(), row[10].asText(), row[11].asText()};
}

// Conditions with the values of their tokens.
class Conditions {
 public:
  void add(const String& condition) { text_ += " and " + condition; }
  void add(const String& condition, const String& token, const String& value) {
    add(condition);
    values_.emplace_back(token, value);
  }
  // Some of the parts stands in some of the columns. Empty parts do not count.
  void addParts(const std::vector<String>& parts, std::initializer_list<const char*> columns) {
    std::vector<String> alternatives;
    for (const String& part : parts) {
      if (part.empty()) continue;
      const String token = "part" + std::to_string(values_.size());
      for (const char* column : columns) alternatives.push_back("charindex(<" + token + ">," + column + ")>0");
      values_.emplace_back(token, part);
    }
    if (!alternatives.empty()) add("(" + join(alternatives, " or ") + ")");
  }

  const String& text() const { return text_; }
  const auto& values() const { return values_; }

 private:
  String text_;
  std::vector<std::pair<String, String>> values_;
};

Conditions conditionsOf(const LogFilter& filter) {
  Conditions conditions;
  if (filter.from != Date::empty()) conditions.add("logTime>=<from>");
  if (filter.to != Date::empty()) conditions.add("logTime<<to>");
  if (filter.userId != 0) conditions.add("userId=" + text(filter.userId));
  if (!filter.templateId.empty()) conditions.add("rtId=<rtId>", "rtId", filter.templateId);
  conditions.addParts({filter.computer}, {"computer"});
  conditions.addParts(filter.users, {"userName", "userLogin"});
  conditions.addParts(filter.templates, {"rt.fullName"});
  conditions.addParts({filter.words}, {"opDesc"});
  return conditions;
}

}  // namespace

Boolean LogPages::read(const LogFilter& filter, Long size, const String& after) {
  return operation(prefixed(message::logNotRead), [&] {
    if (size < 1) throw runtimeFailure(number::argument);
    // One more than wanted tells whether there is a next page. `after` may be this object's own `next`.
    const String query = statement(filter, size + 1, after);
    entries_.clear();
    next_.clear();
    Connection connection = open();
    Recordset row = connection.Execute(query);
    for (; !row.EOF_() && std::ssize(entries_) < size; row.MoveNext()) entries_.push_back(entryOf(row));
    if (!row.EOF_()) next_ = Place{entries_.back().time, entries_.back().id}.text();
    return true;
  });
}

// The first condition on the place is what lets the server begin in the index of the times.
SqlText LogPages::statement(const LogFilter& filter, Long size, const String& after) {
  Conditions conditions = conditionsOf(filter);
  if (!after.empty()) {
    const auto place = Place::parse(after);
    if (!place) throw runtimeFailure(number::argument);
    conditions.add("logTime<=<time>", "time", place->sqlTime());
    conditions.add("(logTime<<time> or logId<<id>)", "id", place->id);
  }
  SqlText filled = sql("select top " + text(size) +
                       " logId,logTime,userName,computer,application,funcName,opDesc,rt.fullName,replacerName,rtId,"
                       "rcId,wiId from sysLog l left outer join repTmps rt on l.rtId=rt.rtUid where logType=" +
                       text(filter.type) + conditions.text() + " order by logTime desc,logId desc");
  filled.date("from", filter.from).date("to", filter.to.addDays(1));
  for (const auto& [token, value] : conditions.values()) filled.text(token, value);
  return filled;
}

}  // namespace QVSa
