#pragma once

#include "QVSa/frame/Collection.h"
#include "QVSa/organisation/userGroup.h"

namespace QVSa {

// The user groups. The key is the group's name.
class QVSA_EXPORT userGroups : public Collection<userGroup> {
 public:
  using Collection::Remove;

  // Makes a new group in memory, which its Save inserts. Throws 457 where the name is taken in this collection.
  std::shared_ptr<userGroup> Add(const String& Name);
  // All groups, in no order; each is read on a connection of its own.
  Boolean GetAll();
};

}  // namespace QVSa
