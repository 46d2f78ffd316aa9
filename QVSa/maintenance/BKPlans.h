#pragma once

#include "QVSa/frame/KeyedCollection.h"
#include "QVSa/maintenance/BKPlan.h"

namespace QVSa {

// The backup plans of a server, by position from 1 or by name, in the order of the server.
class QVSA_EXPORT BKPlans : private Frame {
 public:
  using Frame::connect;
  using Frame::errDescription;
  using Frame::errNumber;

  // Puts a plan with these values into the collection and connects it; it is not saved. Throws 457 for a known name.
  std::shared_ptr<BKPlan> Add(Long Id, const String& Name, String* path = nullptr);
  // Adds all plans of the server to what the collection holds: a second call on one object fails at the first name.
  // A plan says delFiles here only where the column is 1, which Save does not write: load a plan by its GetOne to
  // know.
  Boolean GetAll();
  // Throws 6 for more than 32,767.
  Integer Count() const;
  // Throws 9 for a position out of range, 5 for an unknown name.
  void Remove(const Variant& Index) { items_.remove(Index); }
  // No object for an unknown index.
  std::shared_ptr<BKPlan> Item(const Variant& Index) const;
  auto begin() const { return items_.begin(); }
  auto end() const { return items_.end(); }

 private:
  KeyedCollection<BKPlan> items_;
};

}  // namespace QVSa
