#pragma once

#include "QVSa/values/Date.h"
#include "QVSa/values/Values.h"

namespace QVSa {

// A recurring schedule: which days, and when on them. Nothing is checked until it is computed with.
struct Recurrence {
  Integer cycle = 0;  // 0 days, 1 weeks, 2 months; any other: no days at all
  Integer cycleNum = 1;
  String wks = "0000000";
  Integer monthDay = 0;
  Integer timesOneDay = 0;
  Date StartTime;
  Integer interval = 0;
  Integer valUnit = 0;
};

// The next due moment behind `now`, computed from `now` alone: nothing anchors it to an earlier run. `timeOfDay`
// is set to its time as soon as that is known, before the day is. Whole numbers have 16 bits; throws Failure 6 where
// one overflows or the result lies outside a date's range, 9 for more than seven weekdays, 13 for one that is no digit.
Date nextTime(const Recurrence& schedule, Date now, Date& timeOfDay);

}  // namespace QVSa
