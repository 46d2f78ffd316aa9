#include "QVSa/maintenance/NextTime.h"

#include <array>
#include <limits>

#include "QVSa/values/Failure.h"
#include "QVSa/values/Text.h"

namespace QVSa {

namespace {

constexpr int daysOfWeek = 7;
constexpr int minutesOfHour = 60;
constexpr int lastHour = 23;
// Days of the month that every month has.
constexpr int safeDay = 28;

Integer narrow(int value) {
  if (value < std::numeric_limits<Integer>::min() || value > std::numeric_limits<Integer>::max())
    throw runtimeFailure(number::overflow);
  return static_cast<Integer>(value);
}

Date timeOf(int hour, int minute, int second) { return Date(1899, 12, 30, hour, minute, second); }

int lastDayOf(Date month) { return Date(month.year(), month.month(), 1).addMonths(1).addDays(-1).day(); }

bool isInEveryMonth(int day) { return day >= 1 && day <= safeDay; }

// A schedule at one moment.
class Moment {
 public:
  Moment(const Recurrence& schedule, Date now)
      : schedule_(schedule),
        now_(now),
        today_(now.year(), now.month(), now.day()),
        weekday_((now.weekday() + daysOfWeek - 2) % daysOfWeek + 1) {
    const std::u16string wks = toUtf16(schedule.wks);
    if (wks.size() > daysOfWeek) throw runtimeFailure(number::position);
    cells_.fill(u'0');
    for (std::size_t i = 0; i < wks.size(); ++i) cells_[i + 1] = wks[i];
  }

  Date next(Date& timeOfDay) const {
    const bool runs = isRunDay();
    bool over = false;
    timeOfDay = isRepeating() ? nextSlot(over) : startTime(over);
    const Date day = runs && !over ? today_ : nextDay();
    const Date result(day.days() + timeOfDay.days());
    result.year();  // fails outside the range
    return result;
  }

 private:
  int cell(int weekday) const {
    const char16_t digit = cells_[static_cast<std::size_t>(weekday)];
    if (digit < u'0' || digit > u'9') throw runtimeFailure(number::type);
    return digit - u'0';
  }

  bool isRunDay() const {
    switch (schedule_.cycle) {
      case 0:
        return true;
      case 1:
        return cell(weekday_) == 1;
      case 2:
        return now_.day() == monthDay();
      default:
        return false;
    }
  }

  // Of this month.
  int monthDay() const {
    if (isInEveryMonth(schedule_.monthDay)) return schedule_.monthDay;
    return cutToMonth(today_);
  }

  int cutToMonth(Date month) const {
    const int last = lastDayOf(month);
    return schedule_.monthDay == 0 || schedule_.monthDay > last ? last : schedule_.monthDay;
  }

  bool isRepeating() const { return schedule_.timesOneDay == 0 && schedule_.interval > 0; }

  // A moment that is just now counts as passed.
  Date startTime(bool& over) const {
    over = !(schedule_.StartTime > timeOf(now_.hour(), now_.minute(), now_.second()));
    return schedule_.StartTime;
  }

  // The division goes towards zero: before the start the grid runs backwards and is one slot late.
  Date nextSlot(bool& over) const {
    const Date start = schedule_.StartTime;
    const int unit = schedule_.valUnit == 0 ? minutesOfHour : 1;
    const int first = start.hour() * minutesOfHour + start.minute();
    const int minute = now_.hour() * minutesOfHour + now_.minute();
    const Integer slot = narrow((minute - first) / narrow(schedule_.interval * unit) + 1);
    const Integer next = narrow(first + narrow(narrow(schedule_.interval * slot) * unit));
    over = next / minutesOfHour > lastHour;
    return over ? start : timeOf(next / minutesOfHour, next % minutesOfHour, start.second());
  }

  Date nextDay() const {
    switch (schedule_.cycle) {
      case 0:
        return today_.addDays(schedule_.cycleNum);
      case 1:
        return nextWeekday();
      case 2:
        return nextMonthDay();
      default:
        return {};
    }
  }

  // Today's weekday ends the walk whatever its cell holds, so that an empty mask ends as well.
  Date nextWeekday() const {
    int weekday = weekday_;
    Integer days = 0;
    do {
      ++days;
      if (++weekday > daysOfWeek) {
        weekday = 1;
        days = narrow(days + narrow(narrow(schedule_.cycleNum - 1) * daysOfWeek));
      }
    } while (weekday != weekday_ && cell(weekday) == 0);
    return today_.addDays(days);
  }

  Date nextMonthDay() const {
    const Date candidate(now_.year(), now_.month(), monthDay());
    if (candidate > now_) return candidate;
    if (isInEveryMonth(schedule_.monthDay)) return candidate.addMonths(schedule_.cycleNum);
    const Date month = Date(now_.year(), now_.month(), 1).addMonths(schedule_.cycleNum);
    return Date(month.year(), month.month(), cutToMonth(month));
  }

  const Recurrence& schedule_;
  Date now_;
  Date today_;
  int weekday_;  // 1 Monday to 7 Sunday
  std::array<char16_t, daysOfWeek + 1> cells_;
};

}  // namespace

Date nextTime(const Recurrence& schedule, Date now, Date& timeOfDay) { return Moment(schedule, now).next(timeOfDay); }

}  // namespace QVSa
