#include "QVSa/resources/Messages.h"
#include "QVSa/syslog/LogRecords.h"

namespace QVSa {
namespace {

enum QueryValue : std::size_t { startDate, endDate, computerPart, userParts, templateParts, descriptionPart };

// Null is not set, and compares with nothing.
Date dateOf(const Variant& value) { return value.isNull() ? Date::empty() : value.toDate(); }
String textOf(const Variant& value) { return value.isNull() ? String() : value.toText(); }
bool isAfter(const Variant& start, const Variant& end) {
  return !start.isNull() && !end.isNull() && start.toDate() > end.toDate();
}

String anywhere(const String& text) { return "%" + text + "%"; }

// The parts stand in the statement as the caller wrote them, quotes and all.
String userIs(const String& part) { return "UserName like '%" + part + "%' or UserLogin like  '%" + part + "%'"; }

// One condition for all parts of a list. Its place and not the text before it gives a part its "or": a list that begins
// with a "," makes a statement that the server refuses.
template <class Condition>
String anyOf(const String& list, Condition condition) {
  const std::vector<String> parts = split(list, ',');
  String text;
  for (std::size_t i = 0; i < parts.size(); ++i) {
    if (parts[i].empty()) continue;
    text += (i == 0 ? " " : " or ") + condition(parts[i]);
  }
  return text.empty() ? "" : " and (" + text + ")";
}

String userCondition(const String& users) {
  if (users.find(',') != String::npos) return anyOf(users, userIs);
  return " and (" + userIs(users) + " )";
}

String templateCondition(const String& templates) {
  const auto templateIs = [](const String& part) { return "rt.fullName like '%" + part + "%'"; };
  if (templates.find(',') != String::npos) return anyOf(templates, templateIs);
  return " and " + templateIs(templates);
}

String dateCondition(const Date& start, const Date& end) {
  const bool hasStart = start != Date::empty();
  const bool hasEnd = end != Date::empty();
  if (hasStart && hasEnd) {
    return start < end ? " and logTime>=<startDate> and logTime<<endDate>"
                       : " and logTime>=<startDate> and logTime<=<endDate>";
  }
  if (hasStart) return " and logTime>=<startDate>";
  return hasEnd ? " and logTime<<endDate>" : "";
}

}  // namespace

String LogRecords::head() const {
  return "select logId as " + captions_[0] + ",convert(smalldatetime,logTime,120) as " + captions_[1] +
         ",userName as " + captions_[2] + ",computer as " + captions_[3] +
         ",case application when 0 then <app0> when 1 then <app1> when 2 then <app2> else 'Other' end as " +
         captions_[4] + ",funcName as " + captions_[5] + ",opDesc as " + captions_[6] + ",rt.fullName as " +
         captions_[7] + ",replacerName as " + captions_[8] + ",rtId,rcId,wiId ";
}

Boolean LogRecords::GetAll(Long LogType, Date startDate, Date endDate, Long operator_, const String& rtId,
                           const String& desc, const String&, Integer, Integer app) {
  return operation(prefixed(message::logNotRead), [&] {
    startQuery();
    String statement =
        head() + " from sysLog l,repTmps rt" + " where logType=" + text(LogType) + " and l.rtId*=rt.rtUid";
    if (startDate != Date::empty()) statement += " and logTime>=<startDate>";
    if (endDate != Date::empty()) statement += " and logTime<<endDate>";
    if (operator_ != 0) statement += " and userId=<operator>";
    if (!rtId.empty()) statement += " and rtId=<rtId>";
    if (!desc.empty()) statement += " and opDesc like <desc>";
    statement += " order by logTime desc";
    return showRows(sql(statement)
                        .date("startDate", startDate)
                        .date("endDate", endDate.addDays(1))
                        .number("operator", operator_)
                        .text("rtId", rtId)
                        .text("desc", anywhere(desc))
                        .text("app0", LoadResString(1711))
                        .text("app1", LoadResString(1712))
                        .text("app2", LoadResString(1713)),
                    app);
  });
}

Boolean LogRecords::GetLogByQuery(std::vector<Variant>& arrList, Long LogType, const String&, Integer, Integer app) {
  return operation(prefixed(message::logNotRead), [&] {
    startQuery();
    if (arrList.size() <= descriptionPart) return false;
    if (isAfter(arrList[startDate], arrList[endDate])) arrList[endDate] = Date::empty();
    const String statement = head() + " from sysLog l left outer join repTmps rt on l.rtId=rt.rtUid" +
                             " where logType=" + text(LogType) + " " + queryConditions(arrList) +
                             " order by logTime desc";
    // The applications of the library's own hosts have no names here.
    return showRows(sql(statement)
                        .date("startDate", arrList[startDate])
                        .date("endDate", dateOf(arrList[endDate]).addDays(1))
                        .text("OpComputer", anywhere(textOf(arrList[computerPart])))
                        .raw("userCondition", userCondition(textOf(arrList[userParts])))
                        .raw("templateCondition", templateCondition(textOf(arrList[templateParts])))
                        .text("desc", anywhere(textOf(arrList[descriptionPart])))
                        .text("app0", "")
                        .text("app1", "")
                        .text("app2", ""),
                    app);
  });
}

String LogRecords::queryConditions(const std::vector<Variant>& arrList) {
  const auto isSet = [&](QueryValue place) { return !textOf(arrList[place]).empty(); };
  String conditions = dateCondition(dateOf(arrList[startDate]), dateOf(arrList[endDate]));
  if (isSet(computerPart)) conditions += " and Computer like <OpComputer>";
  if (isSet(userParts)) conditions += "<userCondition>";
  if (isSet(templateParts)) conditions += "<templateCondition>";
  if (isSet(descriptionPart)) conditions += " and opDesc like <desc>";
  return conditions;
}

void LogRecords::startQuery() {
  Clear();
  dateCols_ = "0|2";
  hiddenCols_ = "0|1|10|11|12";
}

Boolean LogRecords::showRows(const String& statement, Integer app) {
  Connection connection = openAtClient();
  if (recordset_.State() == 1) recordset_.Close();
  recordset_.CursorType(adOpenStatic);
  recordset_.LockType(adLockOptimistic);
  recordset_.Open(statement, connection);
  recordset_.ActiveConnection(nullptr);
  constexpr Integer webPage = 2;
  if (app == webPage) readItems();
  return true;
}

void LogRecords::readItems() {
  KeyedCollection<LogRecord> read;
  for (; !recordset_.EOF_(); recordset_.MoveNext()) {
    auto record = std::make_shared<LogRecord>();
    record->Computer_ = recordset_[3].asText();
    record->description_ = recordset_[6].asText();
    record->FuncName_ = recordset_[5].asText();
    record->LogTime_ = recordset_[1].asText();
    record->operatorName_ = recordset_[2].asText();
    record->rcId_ = recordset_[10].asText();
    record->repName_ = recordset_[7].asText();
    record->rtId_ = recordset_[9].asText();
    record->wiId_ = recordset_[11].asText();
    record->agentName_ = recordset_[8].asText();
    read.add(record);
  }
  if (read.size() > 0) recordset_.MoveFirst();
  items_ = std::move(read);
}

}  // namespace QVSa
