#include "console/Lookup.h"

namespace QVSa::console {

namespace {

template <class Object>
Object load(const Console& console, Integer keyName, const String& key) {
  Object object;
  console.connect(object);
  if (!object.GetOne(keyName, key)) throw Refusal(object.errDescription() + " (" + key + ")", object.errNumber());
  return object;
}

}  // namespace

User userWithId(const Console& console, const String& id) { return load<User>(console, User::byId, id); }

User userOf(const Console& console, const String& login) { return load<User>(console, User::byLogin, login); }

Department departmentOf(const Console& console, const String& number) {
  return load<Department>(console, Department::byNumber, number);
}

Role roleOf(const Console& console, const String& name) { return load<Role>(console, Role::byName, name); }

userGroup groupOf(const Console& console, const String& name) {
  return load<userGroup>(console, userGroup::byName, name);
}

// From <users><user id="12" .../>...</users>. No value holds a "<", so that the beginning of an element is plain.
std::vector<String> memberIds(userGroup& group) {
  const String xml = group.GetUsers();
  if (xml.empty()) require(group.errNumber() == 0, group);
  const String mark = "<user id=\"";
  std::vector<String> ids;
  for (std::size_t place = xml.find(mark); place != String::npos; place = xml.find(mark, place + 1)) {
    const std::size_t start = place + mark.size();
    ids.push_back(xml.substr(start, xml.find('"', start) - start));
  }
  return ids;
}

}  // namespace QVSa::console
