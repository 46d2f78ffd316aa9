#include "bindings/c/Values.h"

#include <algorithm>
#include <cmath>
#include <limits>

#include "QVSa/values/Utf8.h"

namespace QVSa::binding {

namespace {

std::optional<double> numberOf(const qvsa_value& value) {
  switch (value.kind) {
    case QVSA_INTEGER:
      return value.as.integer;
    case QVSA_LONG:
      return value.as.long_;
    case QVSA_DOUBLE:
      return value.as.double_;
    default:
      return std::nullopt;
  }
}

// Without rounding: what does not fit is the caller's mistake.
template <class Whole>
std::optional<Whole> wholeOf(const qvsa_value& value) {
  const std::optional<double> number = numberOf(value);
  if (!number || std::trunc(*number) != *number || *number < std::numeric_limits<Whole>::min() ||
      *number > std::numeric_limits<Whole>::max())
    return std::nullopt;
  return static_cast<Whole>(*number);
}

bool isUtf8(const String& text) {
  const char* const end = text.data() + text.size();
  for (const char* at = text.data(); at < end;)
    if (nextSymbol(at, end) >= strayByte) return false;
  return true;
}

template <class Content, class Given>
std::optional<Content> contentOf(const Given& given) {
  if (given.data == nullptr && given.length > 0) return std::nullopt;
  return given.length == 0 ? Content() : Content(given.data, given.data + given.length);
}

template <class Item>
qvsa_value arrayOf(const std::vector<Item>& items, Memory& memory) {
  std::vector<qvsa_value> values;
  values.reserve(items.size());
  for (const Item& item : items) values.push_back(Converter<Item>::write(item, memory));
  qvsa_value result = emptyValue(QVSA_ARRAY);
  result.as.array = memory.keep(std::move(values));
  return result;
}

struct VariantWriter {
  Memory& memory;
  qvsa_value operator()(std::monostate) const { return emptyValue(QVSA_EMPTY); }
  qvsa_value operator()(Variant::NullValue) const { return emptyValue(QVSA_NULL); }
  qvsa_value operator()(double number) const {
    qvsa_value value = emptyValue(QVSA_DOUBLE);
    value.as.double_ = number;
    return value;
  }
  template <class T>
  qvsa_value operator()(const T& held) const {
    return Converter<T>::write(held, memory);
  }
};

}  // namespace

std::optional<Boolean> Converter<Boolean>::read(const qvsa_value& value) {
  if (value.kind != QVSA_BOOLEAN) return std::nullopt;
  return value.as.boolean != 0;
}

qvsa_value Converter<Boolean>::write(Boolean content, Memory&) {
  qvsa_value value = emptyValue(QVSA_BOOLEAN);
  value.as.boolean = content ? 1 : 0;
  return value;
}

std::optional<Integer> Converter<Integer>::read(const qvsa_value& value) { return wholeOf<Integer>(value); }

qvsa_value Converter<Integer>::write(Integer content, Memory&) {
  qvsa_value value = emptyValue(QVSA_INTEGER);
  value.as.integer = content;
  return value;
}

std::optional<Long> Converter<Long>::read(const qvsa_value& value) { return wholeOf<Long>(value); }

qvsa_value Converter<Long>::write(Long content, Memory&) {
  qvsa_value value = emptyValue(QVSA_LONG);
  value.as.long_ = content;
  return value;
}

std::optional<Date> Converter<Date>::read(const qvsa_value& value) {
  if (value.kind != QVSA_DATE || !std::isfinite(value.as.date)) return std::nullopt;
  return Date(value.as.date);
}

qvsa_value Converter<Date>::write(Date content, Memory&) {
  qvsa_value value = emptyValue(QVSA_DATE);
  value.as.date = content.days();
  return value;
}

std::optional<String> Converter<String>::read(const qvsa_value& value) {
  if (value.kind != QVSA_TEXT) return std::nullopt;
  std::optional<String> text = contentOf<String>(value.as.text);
  if (!text || !isUtf8(*text)) return std::nullopt;
  return text;
}

qvsa_value Converter<String>::write(String content, Memory& memory) {
  qvsa_value value = emptyValue(QVSA_TEXT);
  value.as.text = content.empty() ? qvsa_string{"", 0} : memory.keep(std::move(content));
  return value;
}

std::optional<Bytes> Converter<Bytes>::read(const qvsa_value& value) {
  if (value.kind != QVSA_BYTES) return std::nullopt;
  return contentOf<Bytes>(value.as.bytes);
}

qvsa_value Converter<Bytes>::write(Bytes content, Memory& memory) {
  qvsa_value value = emptyValue(QVSA_BYTES);
  value.as.bytes = memory.keep(std::move(content));
  return value;
}

std::optional<Variant> Converter<Variant>::read(const qvsa_value& value) {
  switch (value.kind) {
    case QVSA_EMPTY:
      return Variant();
    case QVSA_NULL:
      return Variant::null();
    case QVSA_BOOLEAN:
      return Converter<Boolean>::read(value);
    case QVSA_INTEGER:
      return value.as.integer;
    case QVSA_LONG:
      return value.as.long_;
    case QVSA_DOUBLE:
      return value.as.double_;
    case QVSA_DATE:
      return Converter<Date>::read(value);
    case QVSA_TEXT:
      return Converter<String>::read(value);
    case QVSA_BYTES:
      return Converter<Bytes>::read(value);
    default:
      return std::nullopt;
  }
}

qvsa_value Converter<Variant>::write(const Variant& content, Memory& memory) {
  return content.visit(VariantWriter{memory});
}

std::optional<std::vector<Variant>> Converter<std::vector<Variant>>::read(const qvsa_value& value) {
  if (value.kind != QVSA_ARRAY || (value.as.array.items == nullptr && value.as.array.length > 0)) return std::nullopt;
  std::vector<Variant> items;
  for (std::size_t i = 0; i < value.as.array.length; ++i) {
    std::optional<Variant> item = Converter<Variant>::read(value.as.array.items[i]);
    if (!item) return std::nullopt;
    items.push_back(*std::move(item));
  }
  return items;
}

qvsa_value Converter<std::vector<Variant>>::write(const std::vector<Variant>& content, Memory& memory) {
  return arrayOf(content, memory);
}

qvsa_value Converter<std::vector<String>>::write(const std::vector<String>& content, Memory& memory) {
  return arrayOf(content, memory);
}

qvsa_value Converter<Recordset>::write(Recordset& content, Memory& memory) {
  if (content.State() == 0) return emptyValue(QVSA_EMPTY);
  std::vector<String> names;
  for (std::size_t i = 0; i < content.fieldCount(); ++i) names.push_back(content[i].Name());
  const bool hasRows = content.RecordCount() > 0;
  if (hasRows) content.MoveFirst();
  std::vector<qvsa_value> rows{arrayOf(names, memory)};
  for (const std::vector<Variant>& row : content.GetRows()) rows.push_back(arrayOf(row, memory));
  if (hasRows) content.MoveFirst();
  qvsa_value result = emptyValue(QVSA_ARRAY);
  result.as.array = memory.keep(std::move(rows));
  return result;
}

qvsa_value Converter<Recordset*>::write(Recordset* content, Memory& memory) {
  return content == nullptr ? emptyValue(QVSA_EMPTY) : Converter<Recordset>::write(*content, memory);
}

String kindOf(const qvsa_value& value) {
  if (const std::optional<double> number = numberOf(value)) return "the number " + Variant(*number).toText();
  switch (value.kind) {
    case QVSA_EMPTY:
      return "an empty value";
    case QVSA_NULL:
      return "Null";
    case QVSA_BOOLEAN:
      return "a Boolean";
    case QVSA_DATE:
      return std::isfinite(value.as.date) ? "a date" : "a date that is no number";
    case QVSA_TEXT: {
      const std::optional<String> text = contentOf<String>(value.as.text);
      return text && isUtf8(*text) ? "a text" : "a text that is no UTF-8";
    }
    case QVSA_BYTES:
      return "bytes";
    case QVSA_OBJECT:
      return value.as.object == 0 ? "no object" : "an object";
    case QVSA_ARRAY:
      return "an array";
    default:
      return "a value of no known kind";
  }
}

}  // namespace QVSa::binding
