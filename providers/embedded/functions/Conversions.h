#pragma once

#include <optional>

#include "QVSa/values/Date.h"
#include "QVSa/values/Variant.h"
#include "providers/embedded/bind/Types.h"

namespace QVSa::embedded {

enum class Purpose {
  compute,  // an operand that takes the other one's type: no size limit
  cast,     // convert and cast: a longer text is cut, a whole number that does not fit becomes "*"
  store,    // into a column: a longer text is refused with 8152
};

// The type's name in the dialect, for texts of failures.
const char* nameOf(Base base);

// Converts as the dialect does by itself and with convert: '' is 0 as a number and 1900-01-01 as a date, blanks around
// a number are passed over, any non-zero number is 1 as a bit, smalldatetime rounds to the minute, a real becomes a
// whole number by cutting, a decimal is rounded to its scale. `style` is convert's third argument (0 where there is
// none). Throws 245 (text to whole number), 8114 (text to real and decimal), 241 and 242 (text to date), 295, 296 (to
// smalldatetime), 220 (tinyint, smallint), 244, 248, 8115 (other overflow), 8152 (text truncated while storing).
Value convert(const Value& value, const Type& from, const Type& to, Purpose purpose, int style = 0);

// Ticks of 1/300 s since 1900-01-01 and the library's date value, to and fro; a Date rounds to the nearest tick.
std::int64_t ticksOf(Date date);
Date dateOf(std::int64_t ticks);

// What a caller of the provider sees of a value: bit as Boolean, tinyint and smallint as Integer, int as Long, bigint
// and decimal as Long where they are whole and fit and as Double otherwise.
Variant variantOf(Value value, const Type& type);
// The way back, for a value that is to be written to a column of `type`.
Value valueOf(const Variant& variant, const Type& type);

}  // namespace QVSa::embedded
