#include "providers/embedded/functions/Ticks.h"

#include <chrono>

namespace QVSa::embedded {

namespace {

using std::chrono::days;
using std::chrono::sys_days;
using std::chrono::year_month_day;

constexpr sys_days dayOf(int year, int month, int day) { return std::chrono::year{year} / month / day; }

constexpr sys_days firstDay = dayOf(1900, 1, 1);

constexpr std::int64_t dayTicks(int year, int month, int day) {
  return (dayOf(year, month, day) - firstDay).count() * ticksPerDay;
}

}  // namespace

DateParts partsOfTicks(std::int64_t ticks) {
  const std::int64_t day = floorDivide(ticks, ticksPerDay);
  const std::int64_t time = ticks - day * ticksPerDay;
  const year_month_day date{firstDay + days{day}};
  DateParts parts;
  parts.year = static_cast<int>(date.year());
  parts.month = static_cast<int>(static_cast<unsigned>(date.month()));
  parts.day = static_cast<int>(static_cast<unsigned>(date.day()));
  parts.hour = static_cast<int>(time / ticksPerHour);
  parts.minute = static_cast<int>(time / ticksPerMinute % 60);
  parts.second = static_cast<int>(time / ticksPerSecond % 60);
  parts.millisecond = static_cast<int>((time % ticksPerSecond * 10 + 1) / 3);
  return parts;
}

std::int64_t ticksOfParts(const DateParts& parts) {
  return dayTicks(parts.year, parts.month, parts.day) + parts.hour * ticksPerHour + parts.minute * ticksPerMinute +
         parts.second * ticksPerSecond + (parts.millisecond * 3 + 5) / 10;
}

bool isMoment(const DateParts& parts) {
  return parts.month >= 1 && parts.month <= 12 && parts.day >= 1 && parts.day <= daysInMonth(parts.year, parts.month) &&
         parts.hour >= 0 && parts.hour <= 23 && parts.minute >= 0 && parts.minute <= 59 && parts.second >= 0 &&
         parts.second <= 59;
}

int daysInMonth(int year, int month) {
  const std::chrono::year_month_day_last last{std::chrono::year{year} / month / std::chrono::last};
  return static_cast<int>(static_cast<unsigned>(last.day()));
}

bool isDatetime(std::int64_t ticks) {
  return ticks >= dayTicks(1753, 1, 1) && ticks < dayTicks(9999, 12, 31) + ticksPerDay;
}

bool isSmalldatetime(std::int64_t ticks) { return ticks >= 0 && ticks < dayTicks(2079, 6, 7); }

}  // namespace QVSa::embedded
