#pragma once

#include <cstdint>
#include <optional>
#include <string>

namespace QVSa::embedded {

enum class DateTextResult { read, malformed, outOfRange };

// Reads a date, a time or both with a blank or a "T" between them; nothing at all and a bare time mean 1900-01-01.
// Dates: yyyymmdd, yymmdd, yyyy, yyyy-mm-dd (also with "/" or "."), mm/dd/yyyy (dd/mm/yyyy by the styles that say so),
// "Mar 7 2024", "7 Mar 2024". Times: hh:mm, hh:mm:ss, hh:mm:ss.fff, each with AM or PM if wanted.
// The range is not looked at beyond the calendar's own.
DateTextResult readDate(const std::string& text, int style, std::int64_t& ticks);

// The text of convert's style; nothing for a style that is none.
std::optional<std::string> writeDate(std::int64_t ticks, int style);

}  // namespace QVSa::embedded
