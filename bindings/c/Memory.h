#pragma once

#include <forward_list>
#include <vector>

#include "QVSa/values/Values.h"
#include "bindings/c/qvsa.h"

namespace QVSa::binding {

// What the values of one answer point to. It can be moved without moving what it keeps.
class Memory {
 public:
  bool empty() const { return texts_.empty() && bytes_.empty() && arrays_.empty(); }
  qvsa_string keep(String text) {
    const String& kept = texts_.emplace_front(std::move(text));
    return {kept.data(), kept.size()};
  }
  qvsa_bytes keep(Bytes bytes) {
    const Bytes& kept = bytes_.emplace_front(std::move(bytes));
    return {kept.data(), kept.size()};
  }
  qvsa_array keep(std::vector<qvsa_value> array) {
    const std::vector<qvsa_value>& kept = arrays_.emplace_front(std::move(array));
    return {kept.data(), kept.size()};
  }

 private:
  std::forward_list<String> texts_;
  std::forward_list<Bytes> bytes_;
  std::forward_list<std::vector<qvsa_value>> arrays_;
};

}  // namespace QVSa::binding
