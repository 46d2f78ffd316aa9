#include <gtest/gtest.h>

#include "QVSa/values/Date.h"
#include "tests/support/Failures.h"

namespace QVSa {

using test::failureOf;

TEST(Date, CountsDaysFromItsFirstOne) {
  EXPECT_EQ(Date(1899, 12, 30).days(), 0);
  EXPECT_EQ(Date(1900, 1, 1), Date::empty());
  EXPECT_EQ(Date(1900, 3, 1).days(), 61);
  EXPECT_EQ(Date(2012, 4, 1).days(), 41000);
  EXPECT_EQ(Date(100, 1, 1).days(), -657434);
  EXPECT_EQ(Date(9999, 12, 31).days(), 2958465);
}

TEST(Date, EveryDayIsReadBackFromItsParts) {
  Date before(1599, 12, 31);
  const int end = static_cast<int>(Date(2401, 1, 1).days());
  for (int day = static_cast<int>(before.days()) + 1; day < end; ++day) {
    const Date date(static_cast<double>(day));
    ASSERT_EQ(Date(date.year(), date.month(), date.day()), date) << day;
    const bool nextDay = date.day() == before.day() + 1 && date.month() == before.month();
    const bool nextMonth = date.day() == 1 && before.day() >= 28;
    ASSERT_TRUE(nextDay || nextMonth) << day;
    ASSERT_EQ(date.weekday(), before.weekday() % 7 + 1) << day;
    before = date;
  }
  EXPECT_EQ(Date(2024, 2, 29).weekday(), 5);
  EXPECT_EQ(Date(1899, 12, 30).weekday(), 7);
}

TEST(Date, PartsOutsideTheirRangesCarryOver) {
  EXPECT_EQ(Date(2024, 13, 1), Date(2025, 1, 1));
  EXPECT_EQ(Date(2024, 0, 1), Date(2023, 12, 1));
  EXPECT_EQ(Date(2024, 3, 0), Date(2024, 2, 29));
  EXPECT_EQ(Date(2024, 1, 1, 0, 0, -1).text(), "2023-12-31 23:59:59");
  EXPECT_EQ(Date(2024, 1, 1, 49).text(), "2024-01-03 01:00:00");
}

TEST(Date, EverySecondOfADayKeepsItsText) {
  for (int second = 0; second < 86400; ++second) {
    const Date moment(2031, 7, 9, second / 3600, second / 60 % 60, second % 60);
    ASSERT_EQ(moment.hour() * 3600 + moment.minute() * 60 + moment.second(), second);
    ASSERT_EQ(moment.millisecond(), 0);
  }
}

TEST(Date, PartsOfASecondAreCutAndNeverMakeItTheNext) {
  const Date moment = *Date::parse("2024-05-06 10:20:30.999");
  EXPECT_EQ(moment.text(), "2024-05-06 10:20:30");
  EXPECT_EQ(moment.sqlText(), "20240506 10:20:30");
  EXPECT_EQ(moment.millisecond(), 999);
  EXPECT_EQ(Date(45000.99999999999).text(), "2023-03-16 00:00:00");
}

TEST(Date, BeforeDayZeroTheTimeStillRunsForward) {
  EXPECT_EQ(Date(-1.25).text(), "1899-12-29 06:00:00");
  EXPECT_EQ(Date(1899, 12, 29, 6), Date(-1.25));
  EXPECT_EQ(Date(-1.25).dateOnly().text(), "1899-12-29 00:00:00");
  EXPECT_EQ(Date(-1.25).addMonths(1).text(), "1900-01-29 06:00:00");
}

TEST(Date, ABareTimeIsWrittenWithoutADay) {
  EXPECT_EQ(Date::parse("08:30")->text(), "08:30:00");
  EXPECT_EQ(Date::parse("8:30:15")->days(), Date(0.0).days() + (8 * 3600 + 30 * 60 + 15) / 86400.0);
  EXPECT_EQ(Date::parse("08:30")->sqlText(), "18991230 08:30:00");
}

TEST(Date, ReadsItsFormsAndNothingElse) {
  const Date moment(2024, 2, 29, 8, 5, 9);
  for (const char* form : {"2024-02-29 08:05:09", "20240229 08:05:09", "2024-02-29T08:05:09", " 2024-2-29 8:05:09 "})
    EXPECT_EQ(Date::parse(form), moment) << form;
  EXPECT_EQ(Date::parse("20240229"), moment.dateOnly());
  for (const char* form : {"", "  ", "2024", "2023-02-29", "2024-13-01", "2024-00-10", "2024-02-30", "2024-02-29 24:00",
                           "2024-02-29 08:60", "2024-02-29 08:05:09.", "2024-02-29 ab", "2024-02-29 08:05:09 x",
                           "2024-0229", "202402291", "8", "8:5", "29.02.2024", "0099-01-01", "tomorrow"})
    EXPECT_FALSE(Date::parse(form)) << form;
}

TEST(Date, MonthsAreAddedToTheLastDayThatTheTargetHas) {
  EXPECT_EQ(Date(2024, 1, 31, 9, 30).addMonths(1), Date(2024, 2, 29, 9, 30));
  EXPECT_EQ(Date(2024, 3, 31).addMonths(-13), Date(2023, 2, 28));
  EXPECT_EQ(Date(2024, 12, 15).addMonths(1), Date(2025, 1, 15));
}

TEST(Date, OutsideItsYearsItHasNoParts) {
  EXPECT_EQ(failureOf([] { Date(2958466.0).year(); }), number::overflow);
  EXPECT_EQ(failureOf([] { Date(-657435.0).text(); }), number::overflow);
  EXPECT_EQ(failureOf([] { Date(9999, 12, 1).addMonths(1).sqlText(); }), number::overflow);
}

}  // namespace QVSa
