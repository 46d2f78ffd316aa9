#include "QVSa/values/Date.h"

#include <algorithm>
#include <array>
#include <chrono>
#include <cmath>

#include "QVSa/values/Failure.h"

namespace QVSa {

namespace {

constexpr std::int64_t dayMilliseconds = 86'400'000;
constexpr double firstDay = -657'434;  // 0100-01-01
constexpr double lastDay = 2'958'465;  // 9999-12-31
constexpr std::chrono::sys_days epoch = std::chrono::year(1899) / 12 / 30;

struct Parts {
  std::int64_t day;  // whole days since 1899-12-30
  std::int64_t millisecond;
};

struct CalendarDay {
  int year;
  int month;
  int day;
};

std::int64_t floorDiv(std::int64_t a, std::int64_t b) { return a / b - (a % b < 0 ? 1 : 0); }

// Before day 0 the fraction still counts forward from the whole part: -1.25 is six o'clock on day -1.
Parts partsOf(double days) {
  if (!(days > firstDay - 1 && days < lastDay + 1)) throw runtimeFailure(number::overflow);
  const double whole = std::trunc(days);
  const std::int64_t day = static_cast<std::int64_t>(whole);
  const std::int64_t millisecond = std::llround(std::abs(days - whole) * static_cast<double>(dayMilliseconds));
  if (millisecond == dayMilliseconds) return {day + 1, 0};
  return {day, millisecond};
}

double daysOf(Parts parts) {
  const double fraction = static_cast<double>(parts.millisecond) / static_cast<double>(dayMilliseconds);
  const double day = static_cast<double>(parts.day);
  return parts.day < 0 ? day - fraction : day + fraction;
}

// Of a month that may lie outside its year, and a day that may lie outside its month.
std::int64_t dayNumber(int year, std::int64_t month, int day) {
  const std::int64_t months = std::int64_t{12} * year + month - 1;
  const std::int64_t wholeYear = floorDiv(months, 12);
  if (wholeYear < int{std::chrono::year::min()} || wholeYear > int{std::chrono::year::max()})
    throw runtimeFailure(number::overflow);
  const auto first = std::chrono::year(static_cast<int>(wholeYear)) /
                     std::chrono::month(static_cast<unsigned>(months - wholeYear * 12 + 1)) / 1;
  return (std::chrono::sys_days(first) - epoch).count() + std::int64_t{day} - 1;
}

CalendarDay calendarOf(std::int64_t number) {
  const std::chrono::year_month_day date(epoch + std::chrono::days(number));
  return {int{date.year()}, static_cast<int>(unsigned{date.month()}), static_cast<int>(unsigned{date.day()})};
}

int daysInMonth(int year, std::int64_t month) {
  return static_cast<int>(dayNumber(year, month + 1, 1) - dayNumber(year, month, 1));
}

// Writes the number's last digits, `width` of them, and moves behind them.
void putDigits(char*& at, int number, int width) {
  for (int digit = width; digit-- > 0; number /= 10) at[digit] = static_cast<char>('0' + number % 10);
  at += width;
}

// The date in front of the time where it is wanted, a mark between the date's parts where one is given.
String written(const Parts& parts, bool withDate, std::optional<char> mark) {
  std::array<char, 20> text;
  char* at = text.data();
  if (withDate) {
    const CalendarDay date = calendarOf(parts.day);
    putDigits(at, date.year, 4);
    if (mark) *at++ = *mark;
    putDigits(at, date.month, 2);
    if (mark) *at++ = *mark;
    putDigits(at, date.day, 2);
    *at++ = ' ';
  }
  const int seconds = static_cast<int>(parts.millisecond / 1000);
  putDigits(at, seconds / 3600, 2);
  *at++ = ':';
  putDigits(at, seconds / 60 % 60, 2);
  *at++ = ':';
  putDigits(at, seconds % 60, 2);
  return String(text.data(), at);
}

// Reads a text from left to right; every step says whether it found what it was to find.
class Scanner {
 public:
  explicit Scanner(const String& text) : at_(text.data()), end_(text.data() + text.size()) {
    while (at_ < end_ && *at_ == ' ') ++at_;
    while (at_ < end_ && end_[-1] == ' ') --end_;
  }

  bool done() const { return at_ == end_; }

  bool skip(char c) {
    if (done() || *at_ != c) return false;
    ++at_;
    return true;
  }

  bool number(int least, int most, int& value) {
    value = 0;
    int count = 0;
    for (; count < most && !done() && *at_ >= '0' && *at_ <= '9'; ++count) value = value * 10 + (*at_++ - '0');
    return count >= least;
  }

  const char* mark() const { return at_; }
  void back(const char* mark) { at_ = mark; }

 private:
  const char* at_;
  const char* end_;
};

bool scanDate(Scanner& scanner, CalendarDay& date) {
  if (!scanner.number(4, 4, date.year)) return false;
  if (scanner.skip('-')) {
    if (!scanner.number(1, 2, date.month) || !scanner.skip('-') || !scanner.number(1, 2, date.day)) return false;
  } else if (!scanner.number(2, 2, date.month) || !scanner.number(2, 2, date.day)) {
    return false;
  }
  return date.year >= 100 && date.month >= 1 && date.month <= 12 && date.day >= 1 &&
         date.day <= daysInMonth(date.year, date.month);
}

bool scanFraction(Scanner& scanner, int& milliseconds) {
  int scale = 100;
  int digit = 0;
  if (!scanner.number(1, 1, digit)) return false;
  do {
    milliseconds += digit * scale;
    scale /= 10;
  } while (scanner.number(1, 1, digit));
  return true;
}

bool scanTime(Scanner& scanner, std::int64_t& millisecond) {
  int hour = 0, minute = 0, second = 0, milliseconds = 0;
  if (!scanner.number(1, 2, hour) || !scanner.skip(':') || !scanner.number(2, 2, minute)) return false;
  if (scanner.skip(':')) {
    if (!scanner.number(2, 2, second)) return false;
    if (scanner.skip('.') && !scanFraction(scanner, milliseconds)) return false;
  }
  if (hour > 23 || minute > 59 || second > 59) return false;
  millisecond = ((hour * 60 + minute) * 60 + second) * 1000LL + milliseconds;
  return true;
}

}  // namespace

Date::Date(int year, int month, int day, int hour, int minute, int second) {
  const std::int64_t seconds = (static_cast<std::int64_t>(hour) * 60 + minute) * 60 + second;
  const std::int64_t carried = floorDiv(seconds, 86'400);
  days_ = daysOf({dayNumber(year, month, day) + carried, (seconds - carried * 86'400) * 1000});
}

std::optional<Date> Date::parse(const String& text) {
  Scanner scanner(text);
  const char* const start = scanner.mark();
  CalendarDay date{};
  Parts parts{0, 0};
  if (scanDate(scanner, date)) {
    parts.day = dayNumber(date.year, date.month, date.day);
    if (scanner.done()) return Date(daysOf(parts));
    if (!scanner.skip('T') && !scanner.skip(' ')) return std::nullopt;
  } else {
    scanner.back(start);
  }
  if (!scanTime(scanner, parts.millisecond) || !scanner.done()) return std::nullopt;
  return Date(daysOf(parts));
}

int Date::year() const { return calendarOf(partsOf(days_).day).year; }
int Date::month() const { return calendarOf(partsOf(days_).day).month; }
int Date::day() const { return calendarOf(partsOf(days_).day).day; }
int Date::hour() const { return static_cast<int>(partsOf(days_).millisecond / 3'600'000); }
int Date::minute() const { return static_cast<int>(partsOf(days_).millisecond / 60'000 % 60); }
int Date::second() const { return static_cast<int>(partsOf(days_).millisecond / 1000 % 60); }
int Date::millisecond() const { return static_cast<int>(partsOf(days_).millisecond % 1000); }

int Date::weekday() const {
  const std::int64_t sinceSunday = partsOf(days_).day + 6;
  return static_cast<int>(sinceSunday - floorDiv(sinceSunday, 7) * 7) + 1;
}

Date Date::dateOnly() const { return Date(static_cast<double>(partsOf(days_).day)); }

Date Date::addMonths(int months) const {
  const Parts parts = partsOf(days_);
  const CalendarDay date = calendarOf(parts.day);
  const std::int64_t month = std::int64_t{date.month} + months;
  const int day = std::min(date.day, daysInMonth(date.year, month));
  return Date(daysOf({dayNumber(date.year, month, day), parts.millisecond}));
}

String Date::text() const {
  const Parts parts = partsOf(days_);
  return written(parts, parts.day != 0, '-');
}

String Date::sqlText() const { return written(partsOf(days_), true, std::nullopt); }

}  // namespace QVSa
