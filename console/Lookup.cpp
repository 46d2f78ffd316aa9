#include "console/Lookup.h"

namespace QVSa::console {

namespace {

constexpr Integer byId = 1;
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

User userWithId(const Console& console, const String& id) { return load<User>(console, byId, id); }

User userOf(const Console& console, const String& login) { return load<User>(console, byLogin, login); }

Department departmentOf(const Console& console, const String& number) {
  return load<Department>(console, byNumber, number);
}

Role roleOf(const Console& console, const String& name) { return load<Role>(console, byName, name); }

userGroup groupOf(const Console& console, const String& name) { return load<userGroup>(console, byName, name); }

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
