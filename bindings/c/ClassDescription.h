#pragma once

#include <functional>
#include <list>
#include <map>
#include <optional>
#include <string_view>
#include <variant>

#include "QVSa/values/Variant.h"
#include "bindings/c/Handles.h"

namespace QVSa::binding {

// Orders names, which are of ASCII, without regard to case.
struct IgnoreCase {
  bool operator()(std::string_view a, std::string_view b) const;
};

// A type of the public classes: one of the values, or objects of a class.
struct Type {
  const char* value = "Nothing";
  const ClassDescription* object = nullptr;

  String name() const;
};

struct Parameter {
  String name;
  Type type;
  bool isOptional = false;
  bool byReference = false;         // it comes back changed
  std::optional<Variant> fallback;  // of an optional one that has a default
};

// The arguments of one call.
struct Arguments {
  qvsa_value* values;
  std::size_t count;
};

struct Operation {
  String name;
  std::vector<Parameter> parameters;
  Type result;
  std::vector<Variant> failures;  // the results that mean failure; Null is no object
  std::function<qvsa_value(const Operation& self, void* object, Arguments arguments)> call;

  // Throws QVSA_COUNT.
  void checkCount(std::size_t count) const;
};

struct Property {
  String name;
  Type type;
  std::function<qvsa_value(void* object)> get;                                           // none: write-only
  std::function<void(const Property& self, void* object, const qvsa_value& value)> set;  // none: read-only
};

struct Enumeration {
  String name;
  std::vector<std::pair<String, Long>> values;
};

// A public class as the C interface offers it.
struct ClassDescription {
  String name;
  std::list<Property> properties;
  std::list<Operation> operations;
  std::vector<Enumeration> enumerations;           // that its members speak of
  Type items;                                      // of a collection
  std::function<std::vector<Object>(void*)> walk;  // none: no collection
  std::function<std::shared_ptr<void>()> make;

  void add(Property property);
  void add(Operation operation);
  // By name without regard to case. Throw QVSA_NO_MEMBER.
  const Property& property(std::string_view name) const;
  const Operation& operation(std::string_view name) const;

 private:
  using Member = std::variant<const Property*, const Operation*>;
  void addMember(std::string_view name, Member member);
  Member member(std::string_view name) const;

  std::map<std::string_view, Member, IgnoreCase> members_;
};

// For a value that `taker` can't take.
CallFailure wrongType(const String& taker, const Type& type, const qvsa_value& value);

}  // namespace QVSa::binding
