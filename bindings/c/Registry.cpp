#include "bindings/c/Registry.h"

#include <nlohmann/json.hpp>

#include "QVSa/QVSa.h"
#include "bindings/c/Class.h"

// The public classes, each described in the file of its name in classes/.
// clang-format off
#define QVSA_PUBLIC_CLASSES(each) \
  each(AclRule) each(BKPlan) each(BKPlans) each(cCRC32) each(cSchedule) each(DBMgr) \
  each(Department) each(Departments) each(Directory) each(Home) each(IdMgr) each(IdMgrs) \
  each(Job) each(Jobs) each(LogRecord) each(LogRecords) each(QVAgent) each(Role) each(Roles) \
  each(safeRule) each(Session) each(Sessions) each(tmpSafe) each(User) each(userGroup) \
  each(userGroups) each(Users)
// clang-format on

namespace QVSa::binding {

#define QVSA_DECLARE(Name) void describe(Class<Name>& it);
QVSA_PUBLIC_CLASSES(QVSA_DECLARE)

const Registry& registry() {
  static const Registry& all = *new Registry;
  return all;
}

Registry::Registry() {
#define QVSA_ADD(Name) add<Name>(#Name);
  QVSA_PUBLIC_CLASSES(QVSA_ADD)
}

template <class T>
void Registry::add(const char* name) {
  Class<T> described(name);
  describe(described);
  classes_.emplace(descriptionOf<T>().name, &descriptionOf<T>());
}

const ClassDescription& Registry::named(std::string_view name) const {
  const auto entry = classes_.find(name);
  if (entry == classes_.end()) throw CallFailure(QVSA_NO_CLASS, "There is no class \"" + String(name) + "\".");
  return *entry->second;
}

namespace {

using Json = nlohmann::ordered_json;

struct VariantWriter {
  Json operator()(std::monostate) const { return nullptr; }
  Json operator()(Variant::NullValue) const { return nullptr; }
  Json operator()(Date date) const { return date.days(); }
  template <class T>
  Json operator()(const T& content) const {
    return content;
  }
};

Json jsonOf(const Variant& value) { return value.visit(VariantWriter()); }

template <class Items, class Write>
Json listOf(const Items& items, const Write& write) {
  Json list = Json::array();
  for (const auto& item : items) list.push_back(write(item));
  return list;
}

Json jsonOf(const Enumeration& enumeration) {
  return {{"name", enumeration.name}, {"values", listOf(enumeration.values, [](const auto& value) {
                                         return Json{{"name", value.first}, {"value", value.second}};
                                       })}};
}

Json jsonOf(const Property& property) {
  return {{"name", property.name},
          {"type", property.type.name()},
          {"read", static_cast<bool>(property.get)},
          {"write", static_cast<bool>(property.set)}};
}

Json jsonOf(const Parameter& parameter) {
  return {{"name", parameter.name},
          {"type", parameter.type.name()},
          {"optional", parameter.isOptional},
          {"default", parameter.fallback ? jsonOf(*parameter.fallback) : nullptr},
          {"byReference", parameter.byReference}};
}

Json jsonOf(const Operation& operation) {
  return {{"name", operation.name},
          {"result", operation.result.name()},
          {"failure", listOf(operation.failures, [](const Variant& value) { return jsonOf(value); })},
          {"arguments", listOf(operation.parameters, [](const Parameter& parameter) { return jsonOf(parameter); })}};
}

Json jsonOf(const ClassDescription& description) {
  return {{"name", description.name},
          {"items", description.walk ? Json(description.items.name()) : Json()},
          {"properties", listOf(description.properties, [](const Property& property) { return jsonOf(property); })},
          {"operations", listOf(description.operations, [](const Operation& operation) { return jsonOf(operation); })}};
}

}  // namespace

const String& Registry::json() const {
  static const String& kept = *new String(toJson());
  return kept;
}

String Registry::toJson() const {
  Json enumerations = Json::array();
  Json classes = Json::array();
  for (const auto& [name, description] : classes_) {
    for (const Enumeration& enumeration : description->enumerations) enumerations.push_back(jsonOf(enumeration));
    classes.push_back(jsonOf(*description));
  }
  return Json{{"version", version()}, {"enumerations", enumerations}, {"classes", classes}}.dump();
}

}  // namespace QVSa::binding
