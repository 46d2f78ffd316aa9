#pragma once

#include "QVSa/frame/Frame.h"
#include "QVSa/frame/KeyedCollection.h"

namespace QVSa {

// What the list classes of the organisation have in common: records in the order in which they were added, addressed by
// position from 1 or by a text key without regard to case. Every list call empties the collection first, and one that
// fails keeps what it had added by then. Which keys a list has is told at its class.
template <class Record>
class Collection : protected Frame {
 public:
  using Frame::connect;
  using Frame::errDescription;
  using Frame::errNumber;

  // Throws 6 for more than 32,767.
  Integer Count() const { return Variant(static_cast<Long>(items_.size())).toInteger(); }
  // No object for a position or key that is not there; errNumber stays as it is.
  std::shared_ptr<Record> Item(const Variant& Index) const {
    try {
      return items_.at(Index);
    } catch (const Failure&) {
      return nullptr;
    }
  }
  auto begin() const { return items_.begin(); }
  auto end() const { return items_.end(); }

 protected:
  Collection() = default;
  ~Collection() = default;
  Collection(const Collection&) = default;
  Collection& operator=(const Collection&) = default;

  // Takes an item out. Throws 9 for a position out of range, 5 for an unknown key. Gives nothing.
  Variant Remove(const Variant& Index) {
    items_.remove(Index);
    return {};
  }
  // Throws 457 where the key is taken.
  void add(std::shared_ptr<Record> record, const String& key) { items_.add(std::move(record), key); }
  // Passes over a record whose key is taken.
  void addIfNew(std::shared_ptr<Record> record, const String& key) { items_.addIfNew(std::move(record), key); }
  // Emptying counts the items: a collection that has outgrown its counter can't be emptied.
  void clearItems() {
    static_cast<void>(Count());
    items_.clear();
  }

 private:
  KeyedCollection<Record> items_;
};

}  // namespace QVSa
