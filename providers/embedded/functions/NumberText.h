#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

namespace QVSa::embedded {

// Reads a whole number: blanks around, a sign, digits. The empty text and blanks alone are 0. `overflow` tells a number
// that 64 bits do not hold from a text that is none.
std::optional<std::int64_t> readWhole(std::string_view text, bool& overflow);

// Reads sign, digits, point and exponent with blanks around. The empty text is 0.
std::optional<double> readReal(std::string_view text);

// All digits, no exponent: 2.5, 1000000, -0.001.
std::string decimalText(double value);

// Of a real: up to 6 digits (style 0), or with exponent 8 (style 1) or 16 digits (style 2). Exponents have three
// digits.
std::string realText(double value, int style);

}  // namespace QVSa::embedded
