#pragma once

#include <cstdint>

namespace QVSa::embedded {

// A date as it lies in a file: ticks of 1/300 s since 1900-01-01, negative before it.
inline constexpr std::int64_t ticksPerSecond = 300;
inline constexpr std::int64_t ticksPerMinute = 60 * ticksPerSecond;
inline constexpr std::int64_t ticksPerHour = 60 * ticksPerMinute;
inline constexpr std::int64_t ticksPerDay = 24 * ticksPerHour;

// The same moment in the calendar.
struct DateParts {
  int year = 1900;
  int month = 1;
  int day = 1;
  int hour = 0;
  int minute = 0;
  int second = 0;
  int millisecond = 0;  // of ticks: rounded, so 0, 3, 7, 10, ...
};

DateParts partsOfTicks(std::int64_t ticks);
// Rounds milliseconds to the nearest tick. The parts have to be a day of the calendar.
std::int64_t ticksOfParts(const DateParts& parts);
// Whether the parts are a day of the calendar and a time of day.
bool isMoment(const DateParts& parts);

int daysInMonth(int year, int month);

// Division that rounds down, also before 1900.
constexpr std::int64_t floorDivide(std::int64_t a, std::int64_t b) { return a / b - (a % b < 0 ? 1 : 0); }

// 1753-01-01 to 9999-12-31 23:59:59.997: what a datetime can hold.
bool isDatetime(std::int64_t ticks);
// 1900-01-01 to 2079-06-06 23:59: what a smalldatetime can hold.
bool isSmalldatetime(std::int64_t ticks);

}  // namespace QVSa::embedded
