#include "console/Lookup.h"

namespace QVSa::console {

namespace {

constexpr Integer byNumber = 1;
constexpr Integer byName = 2;
constexpr Integer byLogin = 3;

template <class Object>
Object load(const Console& console, Integer keyName, const String& key) {
  Object object;
  console.connect(object);
  if (!object.GetOne(keyName, key)) throw Refusal(object.errDescription() + " (" + key + ")", object.errNumber());
  return object;
}

}  // namespace

User userOf(const Console& console, const String& login) { return load<User>(console, byLogin, login); }

Department departmentOf(const Console& console, const String& number) {
  return load<Department>(console, byNumber, number);
}

Role roleOf(const Console& console, const String& name) { return load<Role>(console, byName, name); }

userGroup groupOf(const Console& console, const String& name) { return load<userGroup>(console, byName, name); }

}  // namespace QVSa::console
