#pragma once

#include "QVSa/frame/Collection.h"
#include "QVSa/organisation/Role.h"

namespace QVSa {

// The roles of the system. The key is the role's name.
class QVSA_EXPORT Roles : public Collection<Role> {
 public:
  using Collection::Remove;

  // Makes a role in memory. Throws 457 where the name is taken in this collection.
  std::shared_ptr<Role> Add(Long Id, const String& Name);
  // All roles, in no order. The second of two roles of one name ends the list with 457.
  Boolean GetAll();
};

}  // namespace QVSa
