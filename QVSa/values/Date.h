#pragma once

#include <optional>

#include "QVSa/values/Values.h"

namespace QVSa {

// A moment: days since 1899-12-30, the fraction being the time of day. Without a time zone: whose clock it is, the
// maker of the value knows. Good to the millisecond between the years 100 and 9999; the parts and texts of a moment
// outside them throw Failure 6.
class QVSA_EXPORT Date {
 public:
  constexpr Date() = default;
  constexpr explicit Date(double days) : days_(days) {}
  // Month 1..12 and day may lie outside their ranges and carry over, as 2024-13-01 is 2025-01-01.
  // Throws Failure 6 for a year beyond 32,767.
  Date(int year, int month, int day, int hour = 0, int minute = 0, int second = 0);

  // 1900-01-01, the mark for "no date" throughout the library.
  static constexpr Date empty() { return Date(2.0); }

  // Reads yyyy-mm-dd and yyyymmdd, either with hh:mm, hh:mm:ss or hh:mm:ss.fff behind a blank or a "T", and a bare
  // time. Between hyphens and before a colon one digit will do. Blanks around are passed over. Nothing for any other
  // text or a day that no calendar has.
  static std::optional<Date> parse(const String& text);

  constexpr double days() const { return days_; }
  int year() const;
  int month() const;
  int day() const;
  int hour() const;
  int minute() const;
  int second() const;
  int millisecond() const;
  // 1 for Sunday to 7 for Saturday.
  int weekday() const;
  Date dateOnly() const;

  // Adds whole months; a day that the target month does not have becomes its last one.
  Date addMonths(int months) const;
  constexpr Date addDays(double days) const { return Date(days_ + days); }

  // "yyyy-mm-dd hh:mm:ss"; a bare time (day number 0) "hh:mm:ss". Parts of a second are cut.
  String text() const;
  // "yyyymmdd hh:mm:ss", the form of every date in a statement. Parts of a second are cut.
  String sqlText() const;

  friend constexpr bool operator==(Date a, Date b) { return a.days_ == b.days_; }
  friend constexpr auto operator<=>(Date a, Date b) { return a.days_ <=> b.days_; }

 private:
  double days_ = 0;
};

}  // namespace QVSa
