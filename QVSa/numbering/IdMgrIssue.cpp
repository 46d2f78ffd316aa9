#include <array>
#include <charconv>
#include <cmath>
#include <limits>

#include "QVSa/numbering/IdMgr.h"

namespace QVSa {
namespace {

// The number in exactly `width` digits: the leading 1 of 10 to the power of the width falls off.
String padded(Integer width, Long number) {
  std::array<char, 400> digits;
  const auto end = std::to_chars(digits.data(), digits.data() + digits.size(), std::pow(10.0, width) + number,
                                 std::chars_format::fixed, 0)
                       .ptr;
  return String(digits.data() + 1, end);
}

}  // namespace

struct IdMgr::Issue {
  String name;
  Long startNo;
  const String& rcId;
  const String& sesId;

  String preFix{};
  Integer ymdStyle = noDate;
  Integer noStyle = 0;
  Integer reuseStyle = noReuse;
  Date today{};   // of the database server
  Date period{};  // its first day

  Boolean isMonthly() const { return ymdStyle == yymm || ymdStyle == yyyymm; }
  Boolean isYearly() const { return ymdStyle == yy || ymdStyle == yyyy; }
  // The period's row lies from its first day to here, excluded. That of a year is stored on January 1.
  Date endDate() const { return isMonthly() ? period.addMonths(1) : period.addDays(1); }
};

String IdMgr::newId(const String& idName, const String& vConnstring, Long startNo, const String& rcId,
                    const String& sesId) {
  return operation(prefixed(message::numberNotIssued), [&]() -> String {
    Issue issue{idName.empty() ? idName_ : idName, startNo, rcId, sesId};
    if (issue.name.empty()) return refuse(message::numberNameMissing);

    Connection connection;
    connection.Open(vConnstring.empty() ? connectionString() : vConnstring);
    connection.Execute("set nocount on");
    if (!readRule(connection, issue)) return refuse(message::numberRuleUnknown, {issue.name});

    if (!rcId.empty() && issue.reuseStyle > noReuse) {
      const String released = reuse(connection, issue);
      if (!released.empty()) return released;
    }
    return issueNext(connection, issue);
  });
}

Boolean IdMgr::readRule(Connection& connection, Issue& issue) {
  Recordset row = connection.Execute(sql("select preFix,ymdStyle,noStyle,reuseStyle,ymd=getdate() "
                                         "from idRule where idName=<idName>")
                                         .text("idName", issue.name));
  if (row.EOF_()) return false;
  issue.preFix = row["prefix"].asText();
  issue.ymdStyle = row["ymdStyle"].asInteger();
  issue.noStyle = row["noStyle"].asInteger();
  issue.reuseStyle = row["reuseStyle"].asInteger();
  issue.today = row["ymd"].asDate().dateOnly();
  if (sameText(issue.name, "_RC")) {
    issue.preFix = "RC";
    issue.ymdStyle = yymmdd;
  }
  issue.period = issue.isMonthly()  ? Date(issue.today.year(), issue.today.month(), 1)
                 : issue.isYearly() ? Date(issue.today.year(), 1, 1)
                                    : issue.today;
  return true;
}

// Without a transaction and without a lock: two callers at once can be given the same released number.
String IdMgr::reuse(Connection& connection, const Issue& issue) {
  const String year = text(issue.today.year());
  const String month = text(issue.today.month());
  String statement = "select min(theId) from idDel where idName=<idName> and (rcId is null or rcId='')";
  if (issue.reuseStyle == sameDay)
    statement += " and yy=" + year + " and mm=" + month + " and dd=" + text(issue.today.day());
  if (issue.reuseStyle == sameMonth) statement += " and yy=" + year + " and mm=" + month;
  String released;
  {
    Recordset row = connection.Execute(sql(statement).text("idName", issue.name));
    if (!row.EOF_()) released = row[0].asText();
  }
  if (released.empty()) return released;
  connection.Execute(sql("update idDel set rcId=<rcId>,sesId=<sesId>"
                         " where idName=<idName> and theId=<newId>")
                         .text("rcId", issue.rcId)
                         .text("sesId", issue.sesId)
                         .text("idName", issue.name)
                         .text("newId", released));
  return released;
}

String IdMgr::issueNext(Connection& connection, const Issue& issue) {
  const String read = sql("select maxId=max(maxId) from idRec "
                          " with (rowlock xlock readpast)"
                          " where idName=<idName>" +
                          String(issue.ymdStyle == noDate ? "" : " and ymd>=<startDate> and ymd<<endDate>"))
                          .text("idName", issue.name)
                          .date("startDate", issue.period)
                          .date("endDate", issue.endDate());
  connection.BeginTrans();
  Boolean isNewRow = false;
  String maxId;
  {
    Recordset row = connection.Execute(read);
    isNewRow = row.EOF_() || row[0].isNull();
    if (!isNewRow) maxId = row["maxId"].asText();
  }
  const String newId =
      trim(issue.preFix) + GetDatePart(issue.ymdStyle, issue.period) + padded(issue.noStyle, nextNumber(issue, maxId));
  store(connection, issue, newId, isNewRow);
  connection.CommitTrans();
  book(connection, issue, newId);
  return newId;
}

Long IdMgr::nextNumber(const Issue& issue, const String& maxId) {
  Long number = 1;
  if (issue.startNo >= 0) {
    number = issue.startNo;
  } else if (const String last = trim(maxId); !last.empty()) {
    number = Variant(rightText(last, issue.noStyle)).toLong();
    if (number == std::numeric_limits<Long>::max()) throw runtimeFailure(number::overflow);
    ++number;
  }
  if (std::pow(10.0, issue.noStyle) <= number)
    fail("IdMgr", message::numbersUsedUp, {issue.name, issue.noStyle, maxId});
  return number;
}

void IdMgr::store(Connection& connection, const Issue& issue, const String& newId, Boolean isNewRow) {
  const String statement = isNewRow ? "insert into idRec(idName,ymd,maxId) "
                                      "values (<idName>,<ymd>,<newId>)"
                                    : "update idRec set maxId=<newId> where idName=<idName>" +
                                          String(issue.ymdStyle == noDate ? "" : " and ymd=<ymd>");
  connection.Execute(sql(statement).text("idName", issue.name).date("ymd", issue.period).text("newId", newId));
}

void IdMgr::book(Connection& connection, const Issue& issue, const String& newId) {
  if (issue.startNo >= 0) {
    connection.Execute(sql("delete from idDel where idName=<idName> and ymd=<baseDate>")
                           .text("idName", issue.name)
                           .date("baseDate", issue.period));
  }
  if (issue.rcId.empty()) return;
  connection.Execute(sql("insert into idDel(idName,theId,ymd,rcId,yy,mm,dd,sesId) values"
                         "(<idName>,<newId>,<ymd>,<rcId>," +
                         text(issue.today.year()) + "," + text(issue.today.month()) + "," + text(issue.today.day()) +
                         ",<sesId>)")
                         .text("idName", issue.name)
                         .text("newId", newId)
                         .date("ymd", issue.today)
                         .text("rcId", issue.rcId)
                         .text("sesId", issue.sesId));
}

String IdMgr::GetDatePart(Integer style, Date date) {
  const String year = std::to_string(date.year());
  const String shortYear = rightText(year, 2);
  const String month = rightText(std::to_string(100 + date.month()), 2);
  const String day = rightText(std::to_string(100 + date.day()), 2);
  switch (style) {
    case yymm:
      return shortYear + month;
    case yyyymm:
      return year + month;
    case yymmdd:
      return shortYear + month + day;
    case yyyymmdd:
      return year + month + day;
    case yy:
      return shortYear;
    case yyyy:
      return year;
    default:
      return "";
  }
}

Boolean IdMgr::setStartNo(Long startNo) {
  if (startNo == 0) return true;
  // A negative number stays what it means to newId: an ordinary issue.
  return !newId(idName_, "", startNo < 0 ? startNo : startNo - 1, "", "").empty();
}

}  // namespace QVSa
