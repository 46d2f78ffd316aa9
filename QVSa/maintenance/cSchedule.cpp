#include "QVSa/maintenance/cSchedule.h"

#include "QVSa/frame/ConnectionString.h"
#include "QVSa/resources/Messages.h"

namespace QVSa {

Date cSchedule::GetNextTime(Date nowTime) {
  hasAnswered_ = false;
  return operation(plain(), Date(), [&](Date& result) {
    result = nextTime(rule_, nowTime, result);
    hasAnswered_ = true;
  });
}

String cSchedule::description() {
  const String lines = operation(plain(), [&] { return dayLine() + "\r\n" + timeLine(); });
  hasAnswered_ = !lines.empty();
  return lines;
}

String cSchedule::dayLine() const {
  switch (cycle()) {
    case 0:
      return fillMsg(LoadResString(3201), {cycleNum()});
    case 1:
      return fillMsg(LoadResString(3202), {cycleNum(), dayNames()});
    case 2:
      return monthDay() == 0 ? fillMsg(LoadResString(3204), {cycleNum()})
                             : fillMsg(LoadResString(3203), {cycleNum(), monthDay()});
    default:
      return {};
  }
}

String cSchedule::dayNames() const {
  const std::u16string mask = toUtf16(wks());
  std::vector<String> names;
  for (std::size_t i = 0; i < mask.size() && i < 7; ++i)
    if (mask[i] == u'1') names.push_back(LoadResString(3207 + static_cast<Long>(i)));
  return join(names, ", ");
}

// The message for repeating says hours whatever the unit is, which stands with the number.
String cSchedule::timeLine() const {
  if (timesOneDay() == 1) return fillMsg(LoadResString(3205), {StartTime()});
  const String every = text(interval()) + " " + LoadResString(Long{3217} + valUnit());
  return fillMsg(LoadResString(3206), {StartTime(), every});
}

Long cSchedule::getNextSch(Date baseTime, Integer& T, Long& Id, Long& no, Date& d) {
  return operation(plain(), Long{-1}, [&](Long& result) {
    Connection connection;
    connection.Open(buildConnString(server(), "", false));
    Recordset row = connection.Execute(sql("select top 1 a.taskType,a.taskId,b.schNo,b.pTime"
                                           " from tasks a,QVTaskSche b"
                                           " where b.ptime>= <t> and b.state=0 and a.taskId=b.taskId"
                                           " order by b.ptime")
                                           .date("t", baseTime));
    if (row.EOF_()) {
      result = 0;
      return;
    }
    const Integer type = row["taskType"].asInteger();
    Id = row["taskId"].asLong();
    T = type;
    no = row["schNo"].asLong();
    d = row["pTime"].asDate();
    result = 1;
  });
}

}  // namespace QVSa
