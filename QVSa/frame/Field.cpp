#include <algorithm>

#include "QVSa/frame/Recordset.h"
#include "providers/Provider.h"

namespace QVSa {

String Field::Name() const { return recordset_->columns_[ordinal_].name; }

Variant Field::Value() const { return recordset_->valueAt(ordinal_); }

void Field::Value(const Variant& value) { recordset_->change(ordinal_, value); }

Long Field::ActualSize() const { return static_cast<Long>(recordset_->chunksOf(ordinal_).data.size()); }

void Field::AppendChunk(const Bytes& data) { recordset_->append(ordinal_, data); }

Bytes Field::GetChunk(Long length) {
  if (length < 0) throw runtimeFailure(number::argument);
  Recordset::Chunks& chunks = recordset_->chunksOf(ordinal_);
  const std::size_t size = std::min(static_cast<std::size_t>(length), chunks.data.size() - chunks.position);
  const auto begin = chunks.data.begin() + static_cast<std::ptrdiff_t>(chunks.position);
  chunks.position += size;
  return Bytes(begin, begin + static_cast<std::ptrdiff_t>(size));
}

bool Field::isNull() const { return Value().isNull(); }

Long Field::asLong() const {
  const Variant value = Value();
  return value.isNull() ? 0 : value.toLong();
}

Integer Field::asInteger() const {
  const Variant value = Value();
  return value.isNull() ? Integer{0} : value.toInteger();
}

Date Field::asDate() const {
  const Variant value = Value();
  return value.isNull() ? Date() : value.toDate();
}

String Field::asText() const {
  Variant value = Value();
  return value.isNull() ? String() : std::move(value).toText();
}

Boolean Field::asBoolean() const {
  const Variant value = Value();
  return !value.isNull() && value.toBoolean();
}

Boolean Field::isOne() const {
  const Variant value = Value();
  return value.isBoolean() ? value.toBoolean() : value.isNumeric() && value.toDouble() == 1;
}

}  // namespace QVSa
