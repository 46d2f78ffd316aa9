#include "QVSa/frame/SQLFactory.h"

#include <algorithm>
#include <cmath>

#include "QVSa/values/Failure.h"
#include "QVSa/values/Text.h"

namespace QVSa {

namespace {

constexpr Long noSql = -1;

String token(const String& name) { return "<" + name + ">"; }

// A date goes into a statement in the one form that no server setting reads differently.
String plainText(const Variant& value) { return value.isDate() ? value.toDate().sqlText() : value.toText(); }

String quoted(const Date& date) { return "'" + date.sqlText() + "'"; }

String numberLiteral(const Variant& value, bool keepNull) {
  if (value.isNumeric()) return value.toText();
  return keepNull ? "null" : "0";
}

std::optional<Date> readDate(const Variant& value) {
  if (value.isDate()) return value.toDate();
  return value.isText() ? Date::parse(value.toText()) : std::nullopt;
}

// Empty where the value means no date: day numbers 2 and 3 without a time, and whatever reads as no date at all.
String moment(const Variant& value) {
  if (const std::optional<Date> date = readDate(value)) {
    const bool timed = date->hour() != 0 || date->minute() != 0 || date->second() != 0;
    return date->days() > 3.0 || timed ? quoted(*date) : String();
  }
  if (!value.isNumeric()) return {};
  const double number = value.toDouble();
  return number <= 0 || number == 1 || number == 2 ? String() : quoted(dayNumberToDate(number));
}

String dateLiteral(const Variant& value, bool keepNull, bool escapeText) {
  const String literal = moment(value);
  if (!literal.empty()) return literal;
  if (keepNull) return "null";
  return escapeText || value.isNull() ? "''" : "'" + plainText(value) + "'";
}

String escaped(const String& text) { return sqlEscape(text, escapeSingle).toText(); }

String listLiteral(const Variant& value) { return "N'" + replaceAll(escaped(plainText(value)), ",", "',N'") + "'"; }

String textLiteral(const Variant& value, bool keepNull, bool escapeText) {
  const String text = value.isNull() ? String() : plainText(value);
  if (text.empty()) return keepNull ? "null" : "''";
  return "N'" + (escapeText ? escaped(text) : text) + "'";
}

}  // namespace

// Whether the token stands behind the "<" at `at`.
bool SQLFactory::Parameter::tokenAt(const String& text, std::size_t at) const {
  const std::size_t end = at + 1 + name.size();
  return end < text.size() && text[end] == '>' && text.compare(at + 1, name.size(), name) == 0;
}

String SQLFactory::Parameter::literal() const {
  switch (type) {
    case paraList:
      return listLiteral(value);
    case paraVerbatim:
      return plainText(value);
    case paraNumber:
      return numberLiteral(value, keepNull);
    case paraDate:
      return dateLiteral(value, keepNull, escapeText);
    default:
      return textLiteral(value, keepNull, escapeText);
  }
}

void SQLFactory::AddPara(const String& paraName, Long paraType, const Variant& paraValue, Boolean keepNull,
                         Boolean escapeText) {
  parameters_.push_back({paraName, paraType, paraValue, keepNull, escapeText});
}

void SQLFactory::Clear() {
  parameters_.clear();
  errNumber_ = 0;
  errDescription_.clear();
}

Boolean SQLFactory::makeSql(String& sql, const String& nullParas) {
  try {
    if (sql.empty()) sql = sql_;
    if (sql.empty()) throw Failure(noSql, "SQLFactory", "have not sql of need replace.");
    for (const Parameter& parameter : parameters_) sql = replaceAll(sql, token(parameter.name), parameter.literal());
    if (nullParas.empty()) return true;
    for (const String& name : split(nullParas, ',')) sql = replaceAll(sql, token(name), "null");
    return true;
  } catch (...) {
    tellCurrentFailure(errNumber_, errDescription_);
    return false;
  }
}

String SQLFactory::fill(const String& text) const {
  String filled;
  std::size_t done = 0;
  for (std::size_t at = text.find('<'); at != String::npos; at = text.find('<', at + 1)) {
    const auto parameter =
        std::ranges::find_if(parameters_, [&](const Parameter& candidate) { return candidate.tokenAt(text, at); });
    if (parameter == parameters_.end()) continue;
    filled.append(text, done, at - done).append(parameter->literal());
    at += parameter->name.size() + 1;
    done = at + 1;
  }
  return filled.append(text, done);
}

Date dayNumberToDate(double dayNumber) {
  constexpr double dayMilliseconds = 86'400'000;
  const double whole = std::floor(dayNumber);
  const double seconds = std::floor(std::round((dayNumber - whole) * dayMilliseconds) / 1000);
  return Date(std::max(whole, Date::empty().days()) + seconds / 86'400);
}

Variant sqlEscape(const Variant& value, Long mode) {
  if (value.isNull() || value.isEmpty()) return value;
  String text = trimRight(plainText(value));
  if (mode != escapeDouble) text = replaceAll(text, "'", "''");
  if (mode != escapeSingle) text = replaceAll(text, "\"", "\"\"");
  return text;
}

}  // namespace QVSa
