#pragma once

#include "QVSa/values/Values.h"

namespace QVSa {

// The date part of a number, and with it the period after which its sequence begins anew: never, the month, the day,
// the year.
enum qvIdDatePart : Integer { noDate = 0, yymm = 1, yyyymm = 2, yymmdd = 3, yyyymmdd = 4, yy = 5, yyyy = 6 };

// Which released numbers a rule may hand out again, by their day of issue.
enum qvIdReuse : Integer { noReuse = 0, sameDay = 1, sameMonth = 2, anyone = 3 };

}  // namespace QVSa
