#include "QVSa/maintenance/cSchedule.h"

#include "bindings/c/Class.h"

namespace QVSa::binding {

void describe(Class<cSchedule>& schedule) {
  schedule.property<Integer>("cycle", &cSchedule::cycle, &cSchedule::cycle)
      .property<Integer>("cycleNum", &cSchedule::cycleNum, &cSchedule::cycleNum)
      .property<String>("wks", &cSchedule::wks, &cSchedule::wks)
      .property<Integer>("monthDay", &cSchedule::monthDay, &cSchedule::monthDay)
      .property<Integer>("timesOneDay", &cSchedule::timesOneDay, &cSchedule::timesOneDay)
      .property<Date>("StartTime", &cSchedule::StartTime, &cSchedule::StartTime)
      .property<Integer>("interval", &cSchedule::interval, &cSchedule::interval)
      .property<Integer>("valUnit", &cSchedule::valUnit, &cSchedule::valUnit)
      .readOnly("errNumber", &cSchedule::errNumber)
      .readOnly("errDescription", &cSchedule::errDescription)
      .operation("connect", {"server", optional("DBName", "")}, &cSchedule::connect, failsWith(false))
      .operation("GetNextTime", {"nowTime"}, &cSchedule::GetNextTime)
      .operation("description", {}, &cSchedule::description, failsWith(""))
      .operation("getNextSch", {"baseTime", "T", "Id", "no", "d"}, &cSchedule::getNextSch, failsWith(-1));
}

}  // namespace QVSa::binding
