#pragma once

#include <string>
#include <string_view>

#include "QVSa/values/Values.h"

namespace QVSa {

// Conversions. Bytes that are no UTF-8 read as U+FFFD; a lone surrogate is written as U+FFFD.
std::u16string toUtf16(const String& text);
String fromUtf16(const std::u16string& text);

// Length in UTF-16 units, as callers count it.
Long textLength(const String& text);

// The part of `text` without the characters of `blanks` at both ends.
std::string_view trimmed(std::string_view text, std::string_view blanks = " ");
// Blanks (U+0020) only, as the run-time's functions of that name.
String trimLeft(const String& text);
String trimRight(const String& text);
String trim(const String& text);

// Simple case mapping of every script, independent of the locale.
String upperCase(const String& text);
String lowerCase(const String& text);
// Without regard to case.
bool sameText(const String& a, const String& b);

// The first `units` and the last `units` UTF-16 units.
String leftText(const String& text, Long units);
String rightText(const String& text, Long units);

// At every occurrence; an empty text gives one empty part.
std::vector<String> split(const String& text, char separator);
String join(const std::vector<String>& parts, const String& separator);
// Every occurrence of `what`, without rescanning what was put in.
String replaceAll(const String& text, const String& what, const String& with);

// A whole number in decimal, for a statement.
String text(Long value);

}  // namespace QVSa
