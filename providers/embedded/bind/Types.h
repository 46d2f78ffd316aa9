#pragma once

#include <string>

#include "QVSa/values/OneOf.h"
#include "QVSa/values/Values.h"

namespace QVSa::embedded {

// The dialect's types, as far as the engine tells them apart. How a value of each lies in a file:
//   bit .. bigint        INTEGER
//   decimal              BLOB of 16 bytes that compare as the numbers do (Decimal.h)
//   real                 REAL
//   smalldatetime,       INTEGER: ticks of 1/300 s since 1900-01-01, negative before it
//   datetime
//   varchar .. ntext     TEXT in UTF-8
//   image                BLOB
enum class Base {
  unknown,  // of a bare NULL: takes the type of what it meets
  bit,
  tinyint,
  smallint,
  integer,
  bigint,
  decimal,
  real,
  smalldatetime,
  datetime,
  varchar,   // char too
  nvarchar,  // nchar too
  ntext,     // text too
  image,     // binary, varbinary too
};

struct Type {
  Base base = Base::unknown;
  // Characters (UTF-16 units) of a text type, bytes of a binary one, digits of a decimal; -1: no limit.
  int size = -1;
  int scale = 0;  // of a decimal: how many of its digits stand behind the point

  bool isWhole() const { return base >= Base::bit && base <= Base::bigint; }
  bool isNumber() const { return base >= Base::bit && base <= Base::real; }
  bool isDate() const { return base == Base::smalldatetime || base == Base::datetime; }
  bool isText() const { return base >= Base::varchar && base <= Base::ntext; }
  bool isExact() const { return isWhole() || base == Base::decimal; }
  // One that may hold any amount: text that functions do not cut.
  bool isLong() const { return size < 0; }
  friend bool operator==(const Type&, const Type&) = default;
};

// A type as one number, to be handed through a statement's text.
constexpr std::int64_t codeOf(const Type& type) {
  return static_cast<std::int64_t>(type.base) + (std::int64_t{type.scale} << 8) + (std::int64_t{type.size} + 1) * 65536;
}
constexpr Type typeOfCode(std::int64_t code) {
  return {static_cast<Base>(code & 0xFF), static_cast<int>((code >> 16) - 1), static_cast<int>(code >> 8 & 0xFF)};
}

// A value as it lies in a file; std::monostate is NULL.
using Value = OneOf<std::monostate, std::int64_t, double, std::string, Bytes>;

}  // namespace QVSa::embedded
