#pragma once

#include <memory>
#include <optional>
#include <tuple>
#include <utility>

#include "bindings/c/ClassDescription.h"
#include "bindings/c/Values.h"

// From the arguments of the C interface to the call of a member function, and back.
namespace QVSa::binding {

// The description of a class; never destroyed, as the table of handles.
template <class T>
ClassDescription& descriptionOf() {
  static ClassDescription& description = *new ClassDescription;
  return description;
}

template <class T>
concept IsValue = requires {
  Converter<T>::name;
};

template <class T>
struct Converter<std::shared_ptr<T>> {
  static std::optional<std::shared_ptr<T>> read(const qvsa_value& value) {
    if (value.kind != QVSA_OBJECT) return std::nullopt;
    if (value.as.object == 0) return std::shared_ptr<T>();
    const Object object = handles().object(value.as.object);
    if (object.type != &descriptionOf<T>()) return std::nullopt;
    return std::static_pointer_cast<T>(object.pointer);
  }
  static qvsa_value write(std::shared_ptr<T> content, Memory&) {
    qvsa_value value = emptyValue(QVSA_OBJECT);
    if (content) value.as.object = handles().add(Object{std::move(content), &descriptionOf<T>()});
    return value;
  }
};

template <class T>
struct TypeOf {
  static Type get() {
    if constexpr (IsValue<T>)
      return {Converter<T>::name};
    else
      return {"", &descriptionOf<T>()};
  }
};
template <>
struct TypeOf<void> {
  static Type get() { return {}; }
};
template <class T>
struct TypeOf<std::shared_ptr<T>> : TypeOf<T> {};

// What the library gives, as a value that owns what it points to.
template <class Content>
qvsa_value answer(Content&& content) {
  Memory memory;
  qvsa_value value = Converter<std::remove_cvref_t<Content>>::write(std::forward<Content>(content), memory);
  if (!memory.empty()) value.owner = handles().add(std::move(memory));
  return value;
}

// The arguments that a call was given, its count being right.
class Given {
 public:
  Given(const Operation& operation, Arguments arguments) : operation_(operation), arguments_(arguments) {}

  bool isThere(std::size_t i) const { return i < arguments_.count; }
  bool isEmpty(std::size_t i) const { return !isThere(i) || value(i).kind == QVSA_EMPTY; }
  const qvsa_value& value(std::size_t i) const { return arguments_.values[i]; }
  CallFailure wrong(std::size_t i) const {
    const Parameter& parameter = operation_.parameters[i];
    return wrongType("\"" + parameter.name + "\" of " + operation_.name, parameter.type, value(i));
  }

  template <class T>
  T read(std::size_t i) const {
    std::optional<T> content = Converter<T>::read(value(i));
    if (!content) throw wrong(i);
    return *std::move(content);
  }
  // The default where the argument is left out.
  template <class T>
  T readOrDefault(std::size_t i) const {
    const std::optional<Variant>& fallback = operation_.parameters[i].fallback;
    if (!fallback || !isEmpty(i)) return read<T>(i);
    Memory memory;
    return Converter<T>::read(Converter<Variant>::write(*fallback, memory)).value();
  }
  template <class T>
  void giveBack(std::size_t i, T&& content) {
    if (!isThere(i) || !operation_.parameters[i].byReference) return;
    qvsa_value& place = arguments_.values[i];
    const qvsa_value before = std::exchange(place, answer(std::forward<T>(content)));
    if (before.owner != 0) handles().releaseMemory(before.owner);
  }

 private:
  const Operation& operation_;
  Arguments arguments_;
};

struct ArgumentAt {
  Given& given;
  std::size_t index;
};

// What a parameter of type P is called with. By value, or an object that is shared:
template <class P>
struct Slot {
  using Content = P;
  static constexpr bool byReference = false;
  static constexpr bool isOptional = false;

  explicit Slot(ArgumentAt at) : held(at.given.readOrDefault<P>(at.index)) {}
  P&& pass() { return std::move(held); }
  void giveBack(ArgumentAt) {}

  P held;
};

template <IsValue T>
struct Slot<const T&> : Slot<T> {
  using Slot<T>::Slot;
};

// An object that is only looked at.
template <class T>
struct Slot<const T&> {
  using Content = T;
  static constexpr bool byReference = false;
  static constexpr bool isOptional = false;

  explicit Slot(ArgumentAt at) : held(at.given.read<std::shared_ptr<T>>(at.index)) {
    if (!held) throw at.given.wrong(at.index);
    use.emplace(at.given.value(at.index).as.object);
  }
  const T& pass() { return *held; }
  void giveBack(ArgumentAt) {}

  std::shared_ptr<T> held;
  std::optional<Use> use;
};

// By reference.
template <class T>
struct Slot<T&> {
  using Content = T;
  static constexpr bool byReference = true;
  static constexpr bool isOptional = false;

  explicit Slot(ArgumentAt at) : held(at.given.isEmpty(at.index) ? T() : at.given.read<T>(at.index)) {}
  T& pass() { return held; }
  void giveBack(ArgumentAt at) { at.given.giveBack(at.index, std::move(held)); }

  T held;
};

// By reference and optional.
template <class T>
struct Slot<T*> : Slot<T&> {
  static constexpr bool isOptional = true;

  explicit Slot(ArgumentAt at) : Slot<T&>(at), isThere(at.given.isThere(at.index)) {}
  T* pass() { return isThere ? &this->held : nullptr; }

  bool isThere;
};

template <class T>
struct Slot<const T*> {
  using Content = T;
  static constexpr bool byReference = false;
  static constexpr bool isOptional = true;

  explicit Slot(ArgumentAt at) {
    if (!at.given.isEmpty(at.index)) held = at.given.read<T>(at.index);
  }
  const T* pass() { return held ? &*held : nullptr; }
  void giveBack(ArgumentAt) {}

  std::optional<T> held;
};

// Calls `function` with the arguments of a call; those by reference are given back.
template <class Result, class... Parameters, class Function, std::size_t... Indices>
qvsa_value callWith(Given given, const Function& function, std::index_sequence<Indices...>) {
  std::tuple<Slot<Parameters>...> slots(ArgumentAt{given, Indices}...);
  const auto giveBack = [&] { (std::get<Indices>(slots).giveBack({given, Indices}), ...); };
  if constexpr (std::is_void_v<Result>) {
    function(std::get<Indices>(slots).pass()...);
    giveBack();
    return {};
  } else {
    Result result = function(std::get<Indices>(slots).pass()...);
    giveBack();
    return answer(std::forward<Result>(result));
  }
}

}  // namespace QVSa::binding
