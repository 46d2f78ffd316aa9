#include <algorithm>
#include <array>
#include <limits>
#include <utility>

#include "providers/embedded/functions/Conversions.h"
#include "providers/embedded/functions/Function.h"
#include "providers/embedded/functions/Ticks.h"
#include "providers/tsql/SqlFailure.h"

namespace QVSa::embedded {

namespace {

using tsql::sqlFailure;

enum class Part { year, quarter, month, dayOfYear, day, week, weekday, hour, minute, second, millisecond };

Part partOf(std::string_view name) {
  static constexpr std::array<std::pair<std::string_view, Part>, 11> names = {{{"year", Part::year},
                                                                               {"quarter", Part::quarter},
                                                                               {"month", Part::month},
                                                                               {"dayofyear", Part::dayOfYear},
                                                                               {"day", Part::day},
                                                                               {"week", Part::week},
                                                                               {"weekday", Part::weekday},
                                                                               {"hour", Part::hour},
                                                                               {"minute", Part::minute},
                                                                               {"second", Part::second},
                                                                               {"millisecond", Part::millisecond}}};
  const auto found = std::find_if(names.begin(), names.end(), [&](const auto& entry) { return entry.first == name; });
  if (found == names.end()) throw sqlFailure(155, "'" + std::string(name) + "' is not a recognized datepart option.");
  return found->second;
}

std::int64_t dayOf(std::int64_t ticks) { return floorDivide(ticks, ticksPerDay); }

// Weeks begin on Sunday; 1900-01-01 was a Monday.
std::int64_t weekOf(std::int64_t ticks) { return floorDivide(dayOf(ticks) + 1, 7); }

std::int64_t firstDayOfYear(const DateParts& parts) {
  DateParts first;
  first.year = parts.year;
  return dayOf(ticksOfParts(first));
}

std::int64_t monthsOf(const DateParts& parts) { return std::int64_t{parts.year} * 12 + parts.month - 1; }

std::int64_t millisecondsOf(std::int64_t ticks) { return floorDivide(ticks * 10 + 1, 3); }

// The number of parts since a fixed moment: the difference of two counts is the number of boundaries between them.
std::int64_t countOf(Part part, std::int64_t ticks) {
  switch (part) {
    case Part::year:
      return partsOfTicks(ticks).year;
    case Part::quarter:
      return monthsOf(partsOfTicks(ticks)) / 3;
    case Part::month:
      return monthsOf(partsOfTicks(ticks));
    case Part::dayOfYear:
    case Part::day:
    case Part::weekday:
      return dayOf(ticks);
    case Part::week:
      return weekOf(ticks);
    case Part::hour:
      return floorDivide(ticks, ticksPerHour);
    case Part::minute:
      return floorDivide(ticks, ticksPerMinute);
    case Part::second:
      return floorDivide(ticks, ticksPerSecond);
    case Part::millisecond:
      return millisecondsOf(ticks);
  }
  return 0;
}

std::int64_t valueOfPart(Part part, std::int64_t ticks) {
  const DateParts parts = partsOfTicks(ticks);
  switch (part) {
    case Part::year:
      return parts.year;
    case Part::quarter:
      return (parts.month + 2) / 3;
    case Part::month:
      return parts.month;
    case Part::dayOfYear:
      return dayOf(ticks) - firstDayOfYear(parts) + 1;
    case Part::day:
      return parts.day;
    case Part::week:
      return weekOf(ticks) - weekOf(firstDayOfYear(parts) * ticksPerDay) + 1;
    case Part::weekday:
      return dayOf(ticks) + 1 - weekOf(ticks) * 7 + 1;
    case Part::hour:
      return parts.hour;
    case Part::minute:
      return parts.minute;
    case Part::second:
      return parts.second;
    case Part::millisecond:
      return parts.millisecond;
  }
  return 0;
}

// A day that the target month does not have becomes its last one.
std::int64_t addMonths(std::int64_t ticks, std::int64_t months) {
  DateParts parts = partsOfTicks(ticks);
  const std::int64_t target = monthsOf(parts) + months;
  const std::int64_t year = floorDivide(target, 12);
  if (year < 1753 || year > 9999) return std::numeric_limits<std::int64_t>::max();
  parts.year = static_cast<int>(year);
  parts.month = static_cast<int>(target - year * 12) + 1;
  parts.day = std::min(parts.day, daysInMonth(parts.year, parts.month));
  // The ticks of the time of day are kept as they are: milliseconds would be rounded once more.
  DateParts midnight = parts;
  midnight.hour = midnight.minute = midnight.second = midnight.millisecond = 0;
  return ticksOfParts(midnight) + ticks - dayOf(ticks) * ticksPerDay;
}

std::int64_t added(Part part, std::int64_t n, std::int64_t ticks) {
  switch (part) {
    case Part::year:
      return addMonths(ticks, n * 12);
    case Part::quarter:
      return addMonths(ticks, n * 3);
    case Part::month:
      return addMonths(ticks, n);
    case Part::dayOfYear:
    case Part::day:
    case Part::weekday:
      return ticks + n * ticksPerDay;
    case Part::week:
      return ticks + n * 7 * ticksPerDay;
    case Part::hour:
      return ticks + n * ticksPerHour;
    case Part::minute:
      return ticks + n * ticksPerMinute;
    case Part::second:
      return ticks + n * ticksPerSecond;
    case Part::millisecond:
      return ticks + floorDivide(n * 3 + 5, 10);
  }
  return 0;
}

bool fitsInt(std::int64_t value) {
  return value >= std::numeric_limits<std::int32_t>::min() && value <= std::numeric_limits<std::int32_t>::max();
}

void dateAdd(Call& call) {
  const std::int64_t n = call.whole(1);
  if (!fitsInt(n)) throw sqlFailure(8115, "Arithmetic overflow error converting expression to data type int.");
  const std::int64_t ticks = added(partOf(call.text(0)), n, call.whole(2));
  if (!isDatetime(ticks)) throw sqlFailure(517, "Adding a value to a 'datetime' column caused an overflow.");
  call.give(ticks);
}

void dateDiff(Call& call) {
  const Part part = partOf(call.text(0));
  const std::int64_t difference = countOf(part, call.whole(2)) - countOf(part, call.whole(1));
  if (!fitsInt(difference))
    throw sqlFailure(535,
                     "The datediff function resulted in an overflow. The number of dateparts separating two date/time "
                     "instances is too large. Try to use datediff with a less precise datepart.");
  call.give(difference);
}

template <Part part>
void partAlone(Call& call) {
  call.give(valueOfPart(part, call.whole(0)));
}

// Adds or subtracts two moments, each counted from 1900-01-01.
void move(Call& call) {
  const Type type = typeOfCode(call.whole(3));
  const std::int64_t ticks = call.text(2) == "+" ? call.whole(0) + call.whole(1) : call.whole(0) - call.whole(1);
  try {
    call.give(convert(ticks, {Base::datetime, -1}, type, Purpose::compute));
  } catch (const Failure&) {
    throw sqlFailure(
        8115, std::string("Arithmetic overflow error converting expression to data type ") + nameOf(type.base) + ".");
  }
}

void datePart(Call& call) { call.give(valueOfPart(partOf(call.text(0)), call.whole(1))); }

void getDate(Call& call) { call.give(call.session().statementTicks); }

constexpr Function functions[] = {{"t_dateadd", 3, dateAdd},
                                  {"t_datediff", 3, dateDiff},
                                  {"t_datepart", 2, datePart},
                                  {"t_year", 1, partAlone<Part::year>},
                                  {"t_month", 1, partAlone<Part::month>},
                                  {"t_day", 1, partAlone<Part::day>},
                                  {"t_move", 4, move},
                                  {"t_getdate", 0, getDate, false}};

}  // namespace

std::span<const Function> dateFunctions() { return functions; }

}  // namespace QVSa::embedded
