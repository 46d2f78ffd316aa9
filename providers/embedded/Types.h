#pragma once

#include <string>

#include "QVSa/frame/OneOf.h"
#include "QVSa/frame/Values.h"

namespace QVSa::embedded {

// The dialect's types, as far as the engine tells them apart. How a value of each lies in a file:
//   bit .. bigint        INTEGER
//   decimal, real        REAL (whole numbers of decimal too: compared and shown as numbers)
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
  // Characters (UTF-16 units) of a text type, bytes of a binary one; -1: no limit.
  int size = -1;

  bool isWhole() const { return base >= Base::bit && base <= Base::bigint; }
  bool isNumber() const { return base >= Base::bit && base <= Base::real; }
  bool isDate() const { return base == Base::smalldatetime || base == Base::datetime; }
  bool isText() const { return base >= Base::varchar && base <= Base::ntext; }
  friend bool operator==(const Type&, const Type&) = default;
};

// A value as it lies in a file; std::monostate is NULL.
using Value = OneOf<std::monostate, std::int64_t, double, std::string, Bytes>;

}  // namespace QVSa::embedded
