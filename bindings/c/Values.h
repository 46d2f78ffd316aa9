#pragma once

#include <optional>

#include "QVSa/frame/Recordset.h"
#include "QVSa/values/Variant.h"
#include "bindings/c/Memory.h"

// Between the values of the C interface and those of the library; nothing is converted anywhere else.
namespace QVSa::binding {

// For a type `T` of the public classes:
//   name     the type in the description
//   read     what the caller gave, nothing where it is not fit for a T
//   write    what the library gives, with what it points to in `memory`
template <class T>
struct Converter;

template <>
struct Converter<Boolean> {
  static constexpr const char* name = "Boolean";
  static std::optional<Boolean> read(const qvsa_value& value);
  static qvsa_value write(Boolean content, Memory& memory);
};

template <>
struct Converter<Integer> {
  static constexpr const char* name = "Integer";
  static std::optional<Integer> read(const qvsa_value& value);
  static qvsa_value write(Integer content, Memory& memory);
};

template <>
struct Converter<Long> {
  static constexpr const char* name = "Long";
  static std::optional<Long> read(const qvsa_value& value);
  static qvsa_value write(Long content, Memory& memory);
};

template <>
struct Converter<Date> {
  static constexpr const char* name = "Date";
  static std::optional<Date> read(const qvsa_value& value);
  static qvsa_value write(Date content, Memory& memory);
};

template <>
struct Converter<String> {
  static constexpr const char* name = "String";
  static std::optional<String> read(const qvsa_value& value);
  static qvsa_value write(String content, Memory& memory);
};

template <>
struct Converter<Bytes> {
  static constexpr const char* name = "Bytes";
  static std::optional<Bytes> read(const qvsa_value& value);
  static qvsa_value write(Bytes content, Memory& memory);
};

// Anything but objects and arrays.
template <>
struct Converter<Variant> {
  static constexpr const char* name = "Variant";
  static std::optional<Variant> read(const qvsa_value& value);
  static qvsa_value write(const Variant& content, Memory& memory);
};

template <>
struct Converter<std::vector<Variant>> {
  static constexpr const char* name = "Variants";
  static std::optional<std::vector<Variant>> read(const qvsa_value& value);
  static qvsa_value write(const std::vector<Variant>& content, Memory& memory);
};

template <>
struct Converter<std::vector<String>> {
  static constexpr const char* name = "Strings";
  static qvsa_value write(const std::vector<String>& content, Memory& memory);
};

// The names of the columns, then all rows; empty for a closed one. It stands at its first row again afterwards.
template <>
struct Converter<Recordset> {
  static constexpr const char* name = "Rows";
  static qvsa_value write(Recordset& content, Memory& memory);
};

template <>
struct Converter<Recordset*> {
  static constexpr const char* name = "Rows";
  static qvsa_value write(Recordset* content, Memory& memory);
};

// What a value is, for a message: "a text", "the number 70000".
String kindOf(const qvsa_value& value);

// A value of the kind without a content.
inline qvsa_value emptyValue(qvsa_kind kind) {
  qvsa_value value{};
  value.kind = kind;
  return value;
}

}  // namespace QVSa::binding
