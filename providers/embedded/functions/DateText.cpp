#include "providers/embedded/functions/DateText.h"

#include <algorithm>
#include <array>
#include <string_view>

#include "providers/embedded/functions/Ticks.h"

namespace QVSa::embedded {

namespace {

constexpr std::string_view monthNames = "janfebmaraprmayjunjulaugsepoctnovdec";

bool isDigit(char c) { return c >= '0' && c <= '9'; }
char lower(char c) { return c >= 'A' && c <= 'Z' ? static_cast<char>(c + 32) : c; }
bool isLetter(char c) { return lower(c) >= 'a' && lower(c) <= 'z'; }

// Two digits mean the years 1950 to 2049.
int fullYear(int year, std::size_t digits) {
  if (digits > 2) return year;
  return year < 50 ? 2000 + year : 1900 + year;
}

class DateReader {
 public:
  DateReader(std::string_view text, int style) : text_(text), style_(style) {}

  bool read(DateParts& parts) {
    skipBlanks();
    if (done()) return true;
    if (!isTimeAhead()) {
      if (!readDay(parts)) return false;
      if (done()) return true;
      if (!take('T') && !take('t') && !take(' ')) return false;
      skipBlanks();
      if (done()) return true;
    }
    return readTime(parts) && done();
  }

 private:
  struct Number {
    int value = 0;
    std::size_t digits = 0;
  };

  bool done() const { return at_ == text_.size(); }
  char here() const { return done() ? '\0' : text_[at_]; }

  bool take(char c) {
    if (here() != c) return false;
    ++at_;
    return true;
  }

  void skipBlanks() {
    while (take(' ')) continue;
  }

  bool takeNumber(Number& number, std::size_t most) {
    number = {};
    while (isDigit(here()) && number.digits < most) {
      number.value = number.value * 10 + (text_[at_++] - '0');
      ++number.digits;
    }
    return number.digits > 0;
  }

  bool isTimeAhead() const {
    std::size_t end = at_;
    while (end < text_.size() && isDigit(text_[end])) ++end;
    const std::string_view rest = text_.substr(end);
    if (end - at_ > 2 || end == at_) return false;
    return rest.starts_with(':') || isHalfOfDay(rest) || (rest.starts_with(' ') && isHalfOfDay(rest.substr(1)));
  }

  static bool isHalfOfDay(std::string_view text) {
    return text.size() >= 2 && (lower(text[0]) == 'a' || lower(text[0]) == 'p') && lower(text[1]) == 'm' &&
           (text.size() == 2 || !isLetter(text[2]));
  }

  bool readDay(DateParts& parts) {
    if (isLetter(here())) return readMonthName(parts) && readDayAndYear(parts);
    Number first;
    if (!takeNumber(first, 8)) return false;
    const char separator = here();
    if (separator == '-' || separator == '/' || separator == '.') return readNumbers(parts, first);
    if (first.digits <= 2) return readDayFirst(parts, first);
    return readUnseparated(parts, first);
  }

  static bool readUnseparated(DateParts& parts, const Number& number) {
    if (number.digits == 4) {
      parts.year = number.value;
      return true;
    }
    if (number.digits != 8 && number.digits != 6) return false;
    parts.year = fullYear(number.value / 10000, number.digits - 4);
    parts.month = number.value / 100 % 100;
    parts.day = number.value % 100;
    return true;
  }

  bool readNumbers(DateParts& parts, const Number& first) {
    const char separator = text_[at_++];
    Number second, third;
    if (!takeNumber(second, 2) || !take(separator) || !takeNumber(third, 4)) return false;
    if (first.digits == 4 && third.digits <= 2) {
      assign(parts, first, second, third);
    } else if (first.digits <= 2 && (third.digits == 4 || third.digits == 2)) {
      if (isDayFirst())
        assign(parts, third, second, first);
      else
        assign(parts, third, first, second);
    } else {
      return false;
    }
    return true;
  }

  static void assign(DateParts& parts, const Number& year, const Number& month, const Number& day) {
    parts.year = fullYear(year.value, year.digits);
    parts.month = month.value;
    parts.day = day.value;
  }

  bool isDayFirst() const {
    const int form = style_ % 100;
    return form >= 3 && form <= 5;
  }

  bool readMonthName(DateParts& parts) {
    std::string name;
    while (isLetter(here())) name += lower(text_[at_++]);
    if (name.size() < 3) return false;
    const std::size_t found = monthNames.find(name.substr(0, 3));
    if (found == std::string_view::npos || found % 3 != 0) return false;
    parts.month = static_cast<int>(found / 3) + 1;
    return true;
  }

  bool readDayAndYear(DateParts& parts) {
    Number day;
    skipBlanks();
    if (!takeNumber(day, 2)) return false;
    parts.day = day.value;
    take(',');
    return readYear(parts);
  }

  bool readDayFirst(DateParts& parts, const Number& day) {
    parts.day = day.value;
    skipBlanks();
    if (!isLetter(here()) || !readMonthName(parts)) return false;
    take(',');
    return readYear(parts);
  }

  bool readYear(DateParts& parts) {
    Number year;
    skipBlanks();
    if (!takeNumber(year, 4) || (year.digits != 4 && year.digits != 2)) return false;
    parts.year = fullYear(year.value, year.digits);
    return true;
  }

  bool readTime(DateParts& parts) {
    Number hour, minute, second;
    if (!takeNumber(hour, 2)) return false;
    parts.hour = hour.value;
    const bool hasMinutes = take(':');
    if (hasMinutes) {
      if (!takeNumber(minute, 2)) return false;
      parts.minute = minute.value;
      if (take(':')) {
        if (!takeNumber(second, 2)) return false;
        parts.second = second.value;
        if (!readFraction(parts)) return false;
      }
    }
    const bool hasHalf = readHalfOfDay(parts);
    skipBlanks();
    return hasMinutes || hasHalf;
  }

  bool readFraction(DateParts& parts) {
    if (here() != '.' && here() != ':') return true;
    const bool counted = text_[at_++] == ':';  // ":5" are 5 ms, ".5" are half a second
    Number fraction;
    if (!takeNumber(fraction, 3) || isDigit(here())) return false;
    parts.millisecond = fraction.value;
    for (std::size_t digits = fraction.digits; digits < 3 && !counted; ++digits) parts.millisecond *= 10;
    return true;
  }

  bool readHalfOfDay(DateParts& parts) {
    const std::size_t before = at_;
    skipBlanks();
    if (!isHalfOfDay(text_.substr(at_))) {
      at_ = before;
      return false;
    }
    const bool afternoon = lower(here()) == 'p';
    at_ += 2;
    if (parts.hour < 1 || parts.hour > 12) parts.hour = 99;
    if (parts.hour == 12) parts.hour = 0;
    if (afternoon) parts.hour += 12;
    return true;
  }

  std::string_view text_;
  int style_;
  std::size_t at_ = 0;
};

struct Style {
  int number;
  std::string_view form;
};

// Y year, y its last two digits, m month, b its name, d day, e day padded with a blank, h hour, H hour of 12 padded
// with a blank, i minute, s second, f millisecond, A half of the day.
constexpr std::array<Style, 36> styles = {{{0, "b e Y H:iA"},
                                           {100, "b e Y H:iA"},
                                           {1, "m/d/y"},
                                           {101, "m/d/Y"},
                                           {2, "y.m.d"},
                                           {102, "Y.m.d"},
                                           {3, "d/m/y"},
                                           {103, "d/m/Y"},
                                           {4, "d.m.y"},
                                           {104, "d.m.Y"},
                                           {5, "d-m-y"},
                                           {105, "d-m-Y"},
                                           {6, "d b y"},
                                           {106, "d b Y"},
                                           {7, "b d, y"},
                                           {107, "b d, Y"},
                                           {8, "h:i:s"},
                                           {108, "h:i:s"},
                                           {24, "h:i:s"},
                                           {9, "b e Y H:i:s:fA"},
                                           {109, "b e Y H:i:s:fA"},
                                           {10, "m-d-y"},
                                           {110, "m-d-Y"},
                                           {11, "y/m/d"},
                                           {111, "Y/m/d"},
                                           {12, "ymd"},
                                           {112, "Ymd"},
                                           {13, "d b Y h:i:s:f"},
                                           {113, "d b Y h:i:s:f"},
                                           {14, "h:i:s:f"},
                                           {114, "h:i:s:f"},
                                           {20, "Y-m-d h:i:s"},
                                           {120, "Y-m-d h:i:s"},
                                           {21, "Y-m-d h:i:s.f"},
                                           {121, "Y-m-d h:i:s.f"},
                                           {126, "Y-m-dTh:i:s.f"}}};

std::string padded(int value, std::size_t width, char fill = '0') {
  const std::string digits = std::to_string(value);
  return digits.size() < width ? std::string(width - digits.size(), fill) + digits : digits;
}

std::string monthName(int month) {
  std::string name(monthNames.substr(static_cast<std::size_t>(month - 1) * 3, 3));
  name[0] = static_cast<char>(name[0] - 32);
  return name;
}

std::string part(char letter, const DateParts& parts) {
  switch (letter) {
    case 'Y':
      return padded(parts.year, 4);
    case 'y':
      return padded(parts.year % 100, 2);
    case 'm':
      return padded(parts.month, 2);
    case 'b':
      return monthName(parts.month);
    case 'd':
      return padded(parts.day, 2);
    case 'e':
      return padded(parts.day, 2, ' ');
    case 'h':
      return padded(parts.hour, 2);
    case 'H':
      return padded((parts.hour + 11) % 12 + 1, 2, ' ');
    case 'i':
      return padded(parts.minute, 2);
    case 's':
      return padded(parts.second, 2);
    case 'f':
      return padded(parts.millisecond, 3);
    case 'A':
      return parts.hour < 12 ? "AM" : "PM";
    default:
      return std::string(1, letter);
  }
}

}  // namespace

DateTextResult readDate(const std::string& text, int style, std::int64_t& ticks) {
  DateParts parts;
  if (!DateReader(text, style).read(parts)) return DateTextResult::malformed;
  if (!isMoment(parts)) return DateTextResult::outOfRange;
  ticks = ticksOfParts(parts);
  return DateTextResult::read;
}

std::optional<std::string> writeDate(std::int64_t ticks, int style) {
  const DateParts parts = partsOfTicks(ticks);
  const auto found = std::find_if(styles.begin(), styles.end(), [&](const Style& s) { return s.number == style; });
  if (found == styles.end()) return std::nullopt;
  std::string text;
  for (const char letter : found->form) text += part(letter, parts);
  if (style == 126 && parts.millisecond == 0) text.resize(text.find('.'));
  return text;
}

}  // namespace QVSa::embedded
