#pragma once

#include <cassert>
#include <initializer_list>

#include "bindings/c/Call.h"

// How a public class is described to the C interface:
//   void describe(Class<Role>& role) {
//     role.property<String>("Name", &Role::Name, &Role::Name)
//         .readOnly("builtIn", &Role::builtIn)
//         .operation("Delete", {optional("Id", 0)}, &Role::Delete, failsWith(false));
//   }
// Types follow from the members, and which arguments come back. Names and defaults of arguments are no part of a C++
// type and stand here once more; check_headers.py holds them beside the public headers.
namespace QVSa::binding {

// One argument in a description. One that is a pointer in C++ is optional as it is.
struct Argument {
  Argument(const char* argumentName) : name(argumentName) {}

  const char* name;
  std::optional<Variant> fallback{};
  bool isInput = false;
};

inline Argument optional(const char* name, Variant fallback) {
  Argument argument(name);
  argument.fallback = std::move(fallback);
  return argument;
}

// By reference in C++, but never changed.
inline Argument input(const char* name) {
  Argument argument(name);
  argument.isInput = true;
  return argument;
}

// The results by which an operation says that it failed. One without them answers a question, or its negative result
// has a meaning of its own.
template <class... Values>
std::vector<Variant> failsWith(Values... values) {
  return {Variant(values)...};
}
// For an operation that gives an object.
inline std::vector<Variant> failsWithNothing() { return {Variant::null()}; }

template <class T>
class Class {
 public:
  explicit Class(const char* name) {
    description_.name = name;
    description_.make = [] { return std::make_shared<T>(); };
  }

  template <class V>
  Class& property(const char* name, V (T::*get)() const, void (T::*set)(V)) {
    return addProperty<V>(name, reader(get), writer<V>(set));
  }
  template <class V>
  Class& property(const char* name, V (T::*get)() const, void (T::*set)(const V&)) {
    return addProperty<V>(name, reader(get), writer<V>(set));
  }
  template <class V>
  Class& property(const char* name, const V& (T::*get)() const, void (T::*set)(V)) {
    return addProperty<V>(name, reader(get), writer<V>(set));
  }
  template <class V>
  Class& property(const char* name, V (T::*get)(), void (T::*set)(V)) {
    return addProperty<V>(name, reader(get), writer<V>(set));
  }

  template <class Base, class V>
  Class& readOnly(const char* name, V (Base::*get)() const) {
    return addProperty<std::remove_cvref_t<V>>(name, reader(own(get)), nullptr);
  }
  template <class Base, class V>
  Class& readOnly(const char* name, V (Base::*get)()) {
    return addProperty<std::remove_cvref_t<V>>(name, reader(own(get)), nullptr);
  }

  template <class V>
  Class& writeOnly(const char* name, void (T::*set)(V)) {
    using Content = std::remove_cvref_t<V>;
    return addProperty<Content>(name, nullptr, writer<Content>(set));
  }

  template <class Base, class Result, class... Parameters>
  Class& operation(const char* name, std::initializer_list<Argument> arguments, Result (Base::*member)(Parameters...),
                   const std::vector<Variant>& failures = {}) {
    return addOperation<Result, Parameters...>(name, arguments, own(member), failures);
  }
  template <class Base, class Result, class... Parameters>
  Class& operation(const char* name, std::initializer_list<Argument> arguments,
                   Result (Base::*member)(Parameters...) const, const std::vector<Variant>& failures = {}) {
    return addOperation<Result, Parameters...>(name, arguments, own(member), failures);
  }

  // The class is a collection of objects of class Item.
  template <class Item>
  Class& items() {
    description_.items = TypeOf<Item>::get();
    description_.walk = [](void* object) {
      std::vector<Object> all;
      for (const std::shared_ptr<Item>& item : *static_cast<T*>(object)) all.push_back({item, &descriptionOf<Item>()});
      return all;
    };
    return *this;
  }

  // An enumeration that its members speak of.
  Class& enumeration(const char* name, std::vector<std::pair<String, Long>> values) {
    description_.enumerations.push_back({name, std::move(values)});
    return *this;
  }

 private:
  // The base of the classes is private to them. What they publish of it can be named, but only a cast of this form
  // makes it theirs.
  template <class Base, class Result, class... Parameters>
  static auto own(Result (Base::*member)(Parameters...)) {
    return (Result(T::*)(Parameters...))member;
  }
  template <class Base, class Result, class... Parameters>
  static auto own(Result (Base::*member)(Parameters...) const) {
    return (Result(T::*)(Parameters...) const)member;
  }

  template <class Member>
  static auto reader(Member get) {
    return [get](void* object) { return answer((static_cast<T*>(object)->*get)()); };
  }
  template <class V, class Member>
  static auto writer(Member set) {
    return [set](const Property& self, void* object, const qvsa_value& value) {
      std::optional<V> content = Converter<V>::read(value);
      if (!content) throw wrongType(self.name, self.type, value);
      (static_cast<T*>(object)->*set)(*std::move(content));
    };
  }

  template <class V>
  Class& addProperty(const char* name, decltype(Property::get) get, decltype(Property::set) set) {
    description_.add(Property{name, TypeOf<V>::get(), std::move(get), std::move(set)});
    return *this;
  }

  template <class Result, class... Parameters, class Member>
  Class& addOperation(const char* name, std::initializer_list<Argument> arguments, Member member,
                      const std::vector<Variant>& failures) {
    assert(arguments.size() == sizeof...(Parameters));
    Operation operation{name, {}, TypeOf<std::remove_pointer_t<std::remove_cvref_t<Result>>>::get(), failures, {}};
    [[maybe_unused]] const Argument* argument = arguments.begin();
    (operation.parameters.push_back(parameter<Slot<Parameters>>(*argument++)), ...);
    operation.call = [member](const Operation& self, void* object, Arguments given) {
      const auto function = [&](auto&&... passed) -> Result {
        return (static_cast<T*>(object)->*member)(std::forward<decltype(passed)>(passed)...);
      };
      return callWith<Result, Parameters...>(Given(self, given), function, std::index_sequence_for<Parameters...>());
    };
    description_.add(std::move(operation));
    return *this;
  }

  template <class ItsSlot>
  static Parameter parameter(const Argument& argument) {
    return {argument.name, TypeOf<typename ItsSlot::Content>::get(),
            ItsSlot::isOptional || argument.fallback.has_value(), ItsSlot::byReference && !argument.isInput,
            argument.fallback};
  }

  ClassDescription& description_ = descriptionOf<T>();
};

}  // namespace QVSa::binding
