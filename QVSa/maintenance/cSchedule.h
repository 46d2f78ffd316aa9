#pragma once

#include "QVSa/frame/Frame.h"
#include "QVSa/maintenance/NextTime.h"

namespace QVSa {

// A recurring schedule, and the way to the next task that is due in the system database.
//   cSchedule schedule;  schedule.StartTime(*Date::parse("10:00"));  schedule.timesOneDay(1);
//   Date next = schedule.GetNextTime(now);
class QVSA_EXPORT cSchedule : private Frame {
 public:
  using Frame::connect;
  using Frame::errDescription;
  using Frame::errNumber;

  // 0 days, 1 weeks, 2 months; any other value runs on no day.
  Integer cycle() const { return rule_.cycle; }
  void cycle(Integer value) { rule_.cycle = value; }
  // Every so many days, weeks or months.
  Integer cycleNum() const { return rule_.cycleNum; }
  void cycleNum(Integer value) { rule_.cycleNum = value; }
  // One digit a weekday, Monday first; "1" selects the day.
  String wks() const { return rule_.wks; }
  void wks(String value) { rule_.wks = std::move(value); }
  // The day of the month; 0 and a day that the month lacks mean its last one.
  Integer monthDay() const { return rule_.monthDay; }
  void monthDay(Integer value) { rule_.monthDay = value; }
  // 1: once a day, at StartTime; 0: from StartTime on, every interval.
  Integer timesOneDay() const { return rule_.timesOneDay; }
  void timesOneDay(Integer value) { rule_.timesOneDay = value; }
  // A time of day, without a date.
  Date StartTime() const { return rule_.StartTime; }
  void StartTime(Date value) { rule_.StartTime = value; }
  Integer interval() const { return rule_.interval; }
  void interval(Integer value) { rule_.interval = value; }
  // Of the interval: 0 hours, any other value minutes.
  Integer valUnit() const { return rule_.valUnit; }
  void valUnit(Integer value) { rule_.valUnit = value; }

  // The next due moment, counted from `nowTime` alone. On a day without runs a repeating schedule keeps the time of the
  // slot that the day would have had. On failure the time of day as far as it was reached, without a date.
  Date GetNextTime(Date nowTime);
  // Two lines for a person, CR LF between them; empty on failure.
  String description();
  // The first pending run at or after `baseTime` of any task of the server, always from QVSys: 1 and the run, 0 none,
  // -1 failure; the arguments stay untouched then.
  Long getNextSch(Date baseTime, Integer& T, Long& Id, Long& no, Date& d);

 private:
  friend class BKPlan;

  String dayLine() const;
  String timeLine() const;
  String dayNames() const;

  Recurrence rule_;
  bool hasAnswered_ = true;  // whether the last next moment or description could be computed
};

}  // namespace QVSa
