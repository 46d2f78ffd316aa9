#include "tests/support/EnvironmentLocale.h"
#include "tests/support/Scene.h"

namespace QVSa::test {
namespace {

Date at(const String& text) { return *Date::parse(text); }

// Once a day at ten.
cSchedule once(Integer cycle, Integer cycleNum = 1, const String& wks = "0000000", Integer monthDay = 0) {
  cSchedule schedule;
  schedule.cycle(cycle);
  schedule.cycleNum(cycleNum);
  schedule.wks(wks);
  schedule.monthDay(monthDay);
  schedule.timesOneDay(1);
  schedule.StartTime(at("10:00:00"));
  return schedule;
}

// From eight on.
cSchedule repeating(Integer interval, Integer unit, Integer cycle = 0, const String& wks = "0000000") {
  cSchedule schedule = once(cycle, 1, wks);
  schedule.timesOneDay(0);
  schedule.StartTime(at("08:00:00"));
  schedule.interval(interval);
  schedule.valUnit(unit);
  return schedule;
}

String next(cSchedule& schedule, const String& now) { return schedule.GetNextTime(at(now)).text(); }

}  // namespace

TEST(ASchedule, IsNextDue) {
  struct Case {
    cSchedule schedule;
    const char* now;
    const char* due;
    const char* reason = "";
  };
  Case cases[] = {
      {once(0, 2), "2026-03-10 09:00", "2026-03-10 10:00:00"},
      {once(0, 2), "2026-03-10 11:00", "2026-03-12 10:00:00"},
      {once(0), "2026-03-10 10:00:00", "2026-03-11 10:00:00", "what is due just now is not due again"},
      {once(1, 2, "1000100"), "2026-03-11 12:00", "2026-03-13 10:00:00"},
      {once(1, 2, "1000100"), "2026-03-13 12:00", "2026-03-23 10:00:00", "weeks are skipped behind a Sunday"},
      {once(1, 3), "2026-03-11 12:00", "2026-04-01 10:00:00", "no weekday: the same one again"},
      {once(1, 2, "10"), "2026-03-11 12:00", "2026-03-23 10:00:00", "missing weekdays are none"},
      {once(2, 1, "", 31), "2026-01-31 12:00", "2026-02-28 10:00:00"},
      {once(2, 1, "", 31), "2026-02-28 11:00", "2026-03-31 10:00:00"},
      {once(2, 1, "", 30), "2026-02-15 09:00", "2026-02-28 10:00:00"},
      {once(2, 1, "", 30), "2026-02-28 11:00", "2026-03-30 10:00:00"},
      {once(2, 1, "", 0), "2026-01-31 09:00", "2026-01-31 10:00:00"},
      {once(2, 1, "", 0), "2026-01-31 11:00", "2026-02-28 10:00:00"},
      {once(2, 3, "", 15), "2026-01-15 11:00", "2026-04-15 10:00:00"},
      {once(2, 3, "", 15), "2026-01-10 11:00", "2026-01-15 10:00:00", "a day still ahead in this month is taken"},
      {repeating(2, 0), "2026-03-10 09:30", "2026-03-10 10:00:00"},
      {repeating(1, 0), "2026-03-10 23:10", "2026-03-11 08:00:00"},
      {repeating(1, 0), "2026-03-10 22:10", "2026-03-10 23:00:00"},
      {repeating(15, 1), "2026-03-10 23:50", "2026-03-11 08:00:00"},
      {repeating(2, 0, 1, "1000000"), "2026-03-15 13:00", "2026-03-16 14:00:00", "today's slot on the next run day"},
      {repeating(1, 0), "2026-03-10 07:30", "2026-03-10 09:00:00", "before its start it is a slot late"},
      {repeating(1, 0), "2026-03-10 05:30", "2026-03-10 07:00:00"},
      {once(3), "2026-03-10 09:00", "10:00:00", "without a cycle it is a time alone"},
  };
  for (Case& one : cases) EXPECT_EQ(next(one.schedule, one.now), one.due) << one.now << " " << one.reason;
}

TEST(ASchedule, GivesTheTimeThatItReachedWhereItFails) {
  auto schedule = once(0, 1, "11111111");
  EXPECT_EQ(schedule.GetNextTime(at("2026-03-10 09:00")), Date());
  EXPECT_EQ(schedule.errNumber(), number::position);

  auto wide = repeating(600, 0);
  EXPECT_EQ(wide.GetNextTime(at("2026-03-10 09:00")), Date()) << "a step of 36,000 minutes has no 16 bits";
  EXPECT_EQ(wide.errNumber(), number::overflow);

  auto far = once(1, 20000);
  EXPECT_EQ(next(far, "2026-03-15 11:00"), "10:00:00") << "the time of day was known before the day failed";
  EXPECT_EQ(far.errNumber(), number::overflow);
  auto odd = once(1, 1, "0000x00");
  EXPECT_EQ(next(odd, "2026-03-11 11:00"), "10:00:00");
  EXPECT_EQ(odd.errNumber(), number::type);
}

TEST(ASchedule, DescribesItself) {
  const EnvironmentLocale english("C");
  auto schedule = once(0, 2);
  EXPECT_EQ(schedule.description(), "Occurs every [2] day(s)\r\nat [10:00:00]");
  schedule = repeating(15, 1, 1, "1000100");
  EXPECT_EQ(schedule.description(),
            "Occurs every [1] week(s) on [Monday, Friday]\r\nfrom [08:00:00], every [15 Minute(s)] hour(s).");
  schedule = once(2, 3, "", 15);
  EXPECT_EQ(schedule.description(), "Occurs every [3] month(s) on day [15] of that month\r\nat [10:00:00]");
  schedule.monthDay(0);
  schedule.timesOneDay(0);
  EXPECT_EQ(schedule.description(),
            "Occurs every [3] month(s) on the last day if that month\r\nfrom [10:00:00], every [0 Hour(s)] hour(s).");
  schedule.cycle(7);
  schedule.timesOneDay(1);
  EXPECT_EQ(schedule.description(), "\r\nat [10:00:00]");
  schedule.timesOneDay(0);
  schedule.valUnit(9);
  EXPECT_EQ(schedule.description(), "") << "there is no such unit to name";
  EXPECT_EQ(schedule.errNumber(), number::argument);
}

}  // namespace QVSa::test
