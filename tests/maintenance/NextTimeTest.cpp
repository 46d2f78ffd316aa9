#include <chrono>
#include <gtest/gtest.h>
#include <random>

#include "QVSa/maintenance/NextTime.h"

namespace QVSa::test {
namespace {

using namespace std::chrono;

constexpr int minutesOfDay = 1440;

// A schedule computed the slow way: by walking from slot to slot and from day to day.
class Walk {
 public:
  Walk(const Recurrence& rule, sys_days today, int minute, int second)
      : rule_(rule), today_(today), minute_(minute), second_(second) {}

  String result() const {
    const auto [time, over] = slot();
    const sys_days day = runsOn(today_) && !over ? today_ : nextDay();
    const year_month_day date(day);
    // The time of today's slot goes along to the next run day, whether today is one or not.
    return Date(static_cast<int>(date.year()), static_cast<int>(static_cast<unsigned>(date.month())),
                static_cast<int>(static_cast<unsigned>(date.day())), time / 3600, time / 60 % 60, time % 60)
        .text();
  }

 private:
  std::pair<int, bool> slot() const {
    const int start = rule_.StartTime.hour() * 60 + rule_.StartTime.minute();
    const int startSeconds = start * 60 + rule_.StartTime.second();
    if (rule_.timesOneDay != 0 || rule_.interval <= 0) return {startSeconds, startSeconds <= minute_ * 60 + second_};
    const int step = rule_.valUnit == 0 ? rule_.interval * 60 : rule_.interval;
    int slot = start;
    if (minute_ >= start) {
      while (slot <= minute_) slot += step;
    } else {
      // Before the start the slots are gone through backwards, and the one behind the next is taken.
      while (slot - step >= minute_) slot -= step;
      slot += step;
    }
    if (slot >= minutesOfDay) return {startSeconds, true};
    return {slot * 60 + rule_.StartTime.second(), false};
  }

  static int weekdayOf(sys_days day) { return static_cast<int>(weekday(day).iso_encoding()); }

  bool runsOn(sys_days day) const {
    if (rule_.cycle == 0) return true;
    if (rule_.cycle == 1) return rule_.wks[static_cast<std::size_t>(weekdayOf(day)) - 1] == '1';
    const year_month_day date(day);
    const auto number = static_cast<int>(static_cast<unsigned>(date.day()));
    const bool isLast = year_month_day(day + days(1)).month() != date.month();
    return number == rule_.monthDay || (isLast && (rule_.monthDay == 0 || rule_.monthDay > number));
  }

  sys_days nextDay() const {
    if (rule_.cycle == 0) return today_ + days(rule_.cycleNum);
    return rule_.cycle == 1 ? nextWeekday() : nextMonthDay();
  }

  sys_days nextWeekday() const {
    sys_days day = today_;
    do {
      day += days(1);
      if (weekdayOf(day) == 1) day += weeks(rule_.cycleNum - 1);
    } while (!runsOn(day) && weekdayOf(day) != weekdayOf(today_));
    return day;
  }

  sys_days nextMonthDay() const {
    const year_month_day date(today_);
    const year_month month(date.year(), date.month());
    for (sys_days day = today_ + days(1); year_month_day(day).month() == date.month(); day += days(1))
      if (runsOn(day)) return day;
    sys_days day = (month + months(rule_.cycleNum)) / 1;
    while (!runsOn(day)) day += days(1);
    return day;
  }

  const Recurrence& rule_;
  sys_days today_;
  int minute_;
  int second_;
};

TEST(TheNextTime, IsThatOfASlowWalkFromSlotToSlotAndDayToDay) {
  std::mt19937 random(20260310);
  const auto number = [&](int from, int to) { return std::uniform_int_distribution(from, to)(random); };
  for (int i = 0; i < 10'000; ++i) {
    Recurrence rule;
    rule.cycle = static_cast<Integer>(number(0, 2));
    rule.cycleNum = static_cast<Integer>(number(1, 5));
    for (char& digit : rule.wks) digit = number(0, 2) == 0 ? '1' : '0';
    rule.monthDay = static_cast<Integer>(number(0, 33));
    rule.timesOneDay = static_cast<Integer>(number(0, 2) == 0);
    rule.StartTime = Date(1899, 12, 30, number(0, 23), number(0, 59), number(0, 59));
    rule.valUnit = static_cast<Integer>(number(0, 1));
    rule.interval = static_cast<Integer>(number(0, rule.valUnit == 0 ? 30 : 300));
    const sys_days today = sys_days(2024y / 1 / 1) + days(number(0, 1500));
    // Half of the moments lie about the start, where the edges are.
    const int start = rule.StartTime.hour() * 60 + rule.StartTime.minute();
    const int minute = number(0, 1) == 0 ? number(0, minutesOfDay - 1) : std::clamp(start + number(-2, 2), 0, 1439);
    const int second = number(0, 1) == 0 ? number(0, 59) : rule.StartTime.second();
    const year_month_day date(today);
    const Date now(static_cast<int>(date.year()), static_cast<int>(static_cast<unsigned>(date.month())),
                   static_cast<int>(static_cast<unsigned>(date.day())), minute / 60, minute % 60, second);
    Date timeOfDay;
    ASSERT_EQ(nextTime(rule, now, timeOfDay).text(), Walk(rule, today, minute, second).result())
        << now.text() << ", cycle " << rule.cycle << " of " << rule.cycleNum << ", days " << rule.wks << ", day "
        << rule.monthDay << ", once " << rule.timesOneDay << ", from " << rule.StartTime.text() << " every "
        << rule.interval << (rule.valUnit == 0 ? " h" : " min");
  }
}

}  // namespace
}  // namespace QVSa::test
