#pragma once

#include <string>
#include <string_view>

#include "QVSa/values/Values.h"

namespace QVSa {

// Conversions. Bytes that are no UTF-8 read as U+FFFD; a lone surrogate is written as U+FFFD.
QVSA_EXPORT std::u16string toUtf16(const String& text);
QVSA_EXPORT String fromUtf16(const std::u16string& text);

// Length in UTF-16 units, as callers count it.
QVSA_EXPORT Long textLength(const String& text);

// The part of `text` without the characters of `blanks` at both ends.
QVSA_EXPORT std::string_view trimmed(std::string_view text, std::string_view blanks = " ");
// Blanks (U+0020) only, as the run-time's functions of that name.
QVSA_EXPORT String trimLeft(const String& text);
QVSA_EXPORT String trimRight(const String& text);
QVSA_EXPORT String trim(const String& text);

// Simple case mapping of every script, independent of the locale.
QVSA_EXPORT String upperCase(const String& text);
QVSA_EXPORT String lowerCase(const String& text);
// Without regard to case.
QVSA_EXPORT bool sameText(const String& a, const String& b);

// The first `units` and the last `units` UTF-16 units.
QVSA_EXPORT String leftText(const String& text, Long units);
QVSA_EXPORT String rightText(const String& text, Long units);

// At every occurrence; an empty text gives one empty part.
QVSA_EXPORT std::vector<String> split(const String& text, char separator);
QVSA_EXPORT String join(const std::vector<String>& parts, const String& separator);
// Every occurrence of `what`, without rescanning what was put in.
QVSA_EXPORT String replaceAll(const String& text, const String& what, const String& with);

// A whole number in decimal, for a statement.
QVSA_EXPORT String text(Long value);

}  // namespace QVSa
