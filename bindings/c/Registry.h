#pragma once

#include "bindings/c/ClassDescription.h"

namespace QVSa::binding {

// The descriptions of all public classes. Made at its first use, and never changed afterwards.
class Registry {
 public:
  // By name without regard to case. Throws QVSA_NO_CLASS.
  const ClassDescription& named(std::string_view name) const;
  // All classes as JSON, as qvsa.h tells it; made at its first use, and kept.
  const String& json() const;

 private:
  friend const Registry& registry();

  Registry();
  template <class T>
  void add(const char* name);
  String toJson() const;

  std::map<std::string_view, const ClassDescription*, IgnoreCase> classes_;
};

const Registry& registry();

}  // namespace QVSa::binding
