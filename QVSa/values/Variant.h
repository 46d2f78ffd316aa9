#pragma once

#include <cstddef>

#include "QVSa/values/Date.h"
#include "QVSa/values/OneOf.h"
#include "QVSa/values/Values.h"

namespace QVSa {

// A tagged value. Null is the database's NULL; Empty is a value never set.
//
// The conversions follow the run-time's rules and throw Failure: 94 for Null, 13 for a text that does not read as the
// wanted kind, 6 where the value does not fit. Empty converts to 0, False and the empty text. Fractions round half to
// even. A Boolean is -1 or 0 as a number and as a text.
class QVSA_EXPORT Variant {
 public:
  struct NullValue {
    friend constexpr bool operator==(NullValue, NullValue) { return true; }
  };

  Variant() = default;
  Variant(bool value) : value_(value) {}
  Variant(Integer value) : value_(value) {}
  Variant(Long value) : value_(value) {}
  Variant(double value) : value_(value) {}
  Variant(Date value) : value_(value) {}
  Variant(String value) : value_(std::move(value)) {}
  Variant(const char* value) : value_(String(value)) {}
  Variant(Bytes value) : value_(std::move(value)) {}
  Variant(std::nullptr_t) = delete;

  static Variant null() {
    Variant result;
    result.value_ = NullValue{};
    return result;
  }

  bool isEmpty() const { return std::holds_alternative<std::monostate>(value_); }
  bool isNull() const { return std::holds_alternative<NullValue>(value_); }
  bool isText() const { return std::holds_alternative<String>(value_); }
  bool isDate() const { return std::holds_alternative<Date>(value_); }
  bool isBytes() const { return std::holds_alternative<Bytes>(value_); }
  bool isBoolean() const { return std::holds_alternative<bool>(value_); }
  // A number, a Boolean, or a text of sign, digits, point and exponent with blanks around. The empty text is none.
  bool isNumeric() const;

  Long toLong() const;
  Integer toInteger() const;
  double toDouble() const;
  Boolean toBoolean() const;
  Date toDate() const;
  // The default text form: decimal digits, Date::text().
  String toText() const&;
  String toText() &&;
  // The bytes held; of a text its UTF-8. Throws 13 for anything else.
  Bytes toBytes() const;

  // `visitor` called with what is held, as std::visit does it; Empty is std::monostate.
  template <class Visitor>
  decltype(auto) visit(const Visitor& visitor) const {
    return std::visit(visitor, value_);
  }

  // Same kind and same value; no conversion.
  friend bool operator==(const Variant& a, const Variant& b) { return a.value_ == b.value_; }

 private:
  OneOf<std::monostate, NullValue, bool, Integer, Long, double, Date, String, Bytes> value_;
};

}  // namespace QVSa
