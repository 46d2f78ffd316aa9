#pragma once

#include <algorithm>
#include <memory>
#include <optional>
#include <unordered_map>
#include <vector>

#include "QVSa/values/Failure.h"
#include "QVSa/values/Text.h"
#include "QVSa/values/Variant.h"

namespace QVSa {

// An ordered collection of records with optional text keys, which ignore case. Positions count from 1.
template <class Record>
class KeyedCollection {
 public:
  using Pointer = std::shared_ptr<Record>;

  std::size_t size() const { return items_.size(); }
  auto begin() const { return items_.begin(); }
  auto end() const { return items_.end(); }

  void add(Pointer record) { append(std::move(record), std::nullopt); }

  // Throws Failure 457 where the key is taken; nothing is added then.
  void add(Pointer record, const String& key) {
    if (!addIfNew(std::move(record), key)) throw runtimeFailure(number::keyExists);
  }
  // False where the key is taken; nothing is added then.
  bool addIfNew(Pointer record, const String& key) {
    const String folded = lowerCase(key);
    const auto [entry, isNew] = index_.emplace(folded, record);
    if (!isNew) return false;
    try {
      append(std::move(record), folded);
    } catch (...) {
      index_.erase(entry);
      throw;
    }
    return true;
  }

  // By position where `index` is a number, by key where it is a text. Throws 9 for a position out of range, 5 for an
  // unknown key, 13 for an index of another kind.
  Pointer at(const Variant& index) const { return index.isText() ? byKey(index) : items_[positionOf(index)]; }

  void remove(const Variant& index) {
    const auto position = static_cast<std::ptrdiff_t>(index.isText() ? positionOfKey(index) : positionOf(index));
    const auto key = keys_.begin() + position;
    if (*key) index_.erase(**key);
    items_.erase(items_.begin() + position);
    keys_.erase(key);
  }

  void clear() {
    items_.clear();
    keys_.clear();
    index_.clear();
  }

 private:
  // Both or none, also where the memory for one of them is short.
  void append(Pointer record, std::optional<String> key) {
    items_.push_back(std::move(record));
    try {
      keys_.push_back(std::move(key));
    } catch (...) {
      items_.pop_back();
      throw;
    }
  }
  std::size_t positionOf(const Variant& index) const {
    if (!index.isNumeric()) throw runtimeFailure(number::type);
    const Long position = index.toLong();
    if (position < 1 || static_cast<std::size_t>(position) > items_.size()) throw runtimeFailure(number::position);
    return static_cast<std::size_t>(position) - 1;
  }
  // Looked for by the key: one record may stand under several.
  std::size_t positionOfKey(const Variant& index) const {
    const auto key = std::find(keys_.begin(), keys_.end(), lowerCase(index.toText()));
    if (key == keys_.end()) throw runtimeFailure(number::argument);
    return static_cast<std::size_t>(key - keys_.begin());
  }
  Pointer byKey(const Variant& index) const {
    const auto entry = index_.find(lowerCase(index.toText()));
    if (entry == index_.end()) throw runtimeFailure(number::argument);
    return entry->second;
  }

  std::vector<Pointer> items_;
  std::vector<std::optional<String>> keys_;
  std::unordered_map<String, Pointer> index_;
};

}  // namespace QVSa
