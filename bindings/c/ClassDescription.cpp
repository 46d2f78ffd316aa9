#include "bindings/c/ClassDescription.h"

#include <algorithm>
#include <cassert>

#include "bindings/c/Values.h"

namespace QVSa::binding {

bool IgnoreCase::operator()(std::string_view a, std::string_view b) const {
  const auto lower = [](char c) { return c >= 'A' && c <= 'Z' ? static_cast<char>(c - 'A' + 'a') : c; };
  return std::lexicographical_compare(a.begin(), a.end(), b.begin(), b.end(),
                                      [&](char left, char right) { return lower(left) < lower(right); });
}

String Type::name() const { return object == nullptr ? value : object->name; }

void Operation::checkCount(std::size_t count) const {
  const auto isRequired = [](const Parameter& parameter) { return !parameter.isOptional; };
  const auto least = static_cast<std::size_t>(std::count_if(parameters.begin(), parameters.end(), isRequired));
  if (count >= least && count <= parameters.size()) return;
  const String range = least == parameters.size() ? "" : std::to_string(least) + " to ";
  throw CallFailure(QVSA_COUNT, name + " takes " + range + std::to_string(parameters.size()) +
                                    (parameters.size() == 1 ? " argument" : " arguments") + ", not " +
                                    std::to_string(count) + ".");
}

void ClassDescription::add(Property property) {
  properties.push_back(std::move(property));
  addMember(properties.back().name, &properties.back());
}

void ClassDescription::add(Operation operation) {
  operations.push_back(std::move(operation));
  addMember(operations.back().name, &operations.back());
}

void ClassDescription::addMember(std::string_view memberName, Member member) {
  [[maybe_unused]] const bool isNew = members_.emplace(memberName, member).second;
  assert(isNew);
}

ClassDescription::Member ClassDescription::member(std::string_view memberName) const {
  const auto entry = members_.find(memberName);
  if (entry == members_.end())
    throw CallFailure(QVSA_NO_MEMBER, name + " has no member \"" + String(memberName) + "\".");
  return entry->second;
}

const Property& ClassDescription::property(std::string_view memberName) const {
  const Member found = member(memberName);
  if (const auto* const property = std::get_if<const Property*>(&found)) return **property;
  throw CallFailure(QVSA_NO_MEMBER, String(memberName) + " of " + name + " is an operation, no property.");
}

const Operation& ClassDescription::operation(std::string_view memberName) const {
  const Member found = member(memberName);
  if (const auto* const operation = std::get_if<const Operation*>(&found)) return **operation;
  throw CallFailure(QVSA_NO_MEMBER, String(memberName) + " of " + name + " is a property, no operation.");
}

CallFailure wrongType(const String& taker, const Type& type, const qvsa_value& value) {
  return {QVSA_TYPE, taker + " takes a value of type " + type.name() + ", not " + kindOf(value) + "."};
}

}  // namespace QVSa::binding
