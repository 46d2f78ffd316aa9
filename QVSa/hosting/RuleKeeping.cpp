#include "QVSa/hosting/RuleKeeping.h"

#include <algorithm>

namespace QVSa {

namespace {

Date firstDay(Integer dateFormat, Date today) {
  switch (dateFormat) {
    case yymm:
    case yyyymm:
      return Date(today.year(), today.month(), 1);
    case yy:
    case yyyy:
      return Date(today.year(), 1, 1);
    case yymmdd:
    case yyyymmdd:
      return today;
    default:
      return Date::empty();
  }
}

}  // namespace

Boolean RuleKeeping::save(IdMgr& rule, Boolean withNumbers) {
  return operation(plain(), [&]() -> Boolean {
    if (!withNumbers && changesCounter(rule))
      throw Failure(number::argument, "RuleKeeping",
                    "The present period has numbers already: with another date part, numbers could come twice.");
    if (!rule.Save() || !rule.GetOne(rule.idName())) return refuseAs(rule);
    return true;
  });
}

// Whether the date part changes while there are numbers that the new one would count on from, or the old one goes on to
// count. The day is the server's, as for the numbers themselves.
Boolean RuleKeeping::changesCounter(const IdMgr& rule) {
  Connection connection = open();
  Date from;
  {
    Recordset row = connection.Execute(
        sql("select ymdStyle,getdate() from idRule where idName=<idName>").text("idName", rule.idName()));
    if (row.EOF_() || row[0].asInteger() == rule.DateFormat()) return false;
    const Date today = row[1].asDate().dateOnly();
    from = std::min(firstDay(row[0].asInteger(), today), firstDay(rule.DateFormat(), today));
  }
  Recordset numbers = connection.Execute(sql("select count(*) from idRec where idName=<idName> and ymd>=<from>")
                                             .text("idName", rule.idName())
                                             .date("from", from));
  return numbers[0].asLong() > 0;
}

}  // namespace QVSa
