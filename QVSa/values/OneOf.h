#pragma once

#include <utility>
#include <variant>

namespace QVSa {

// std::variant with a copy that may run out of memory. The standard library of GCC 12 takes one of texts and bytes for
// a variant that always holds a value: where its copy fails, it destroys a value that was never made.
template <class... Types>
struct OneOf : std::variant<Types...> {
  using Base = std::variant<Types...>;
  using Base::Base;
  using Base::operator=;

  OneOf() = default;
  OneOf(OneOf&&) noexcept = default;
  OneOf& operator=(OneOf&&) noexcept = default;
  OneOf(const OneOf& other) : Base() { Base::operator=(other); }
  OneOf& operator=(const OneOf& other) = default;
  ~OneOf() = default;
};

}  // namespace QVSa
