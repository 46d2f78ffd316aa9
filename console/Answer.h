#pragma once

#include <nlohmann/json.hpp>
#include <stdexcept>

#include "QVSa/values/Values.h"

namespace QVSa::console {

using Json = nlohmann::ordered_json;

// What a command has to say: the text for a person, the document for a program (`--json`), and the exit code.
struct Answer {
  String text;
  Json document = Json::object();
  int exitCode = 0;
};

// Why a command was not done: the library's failure number (0 for a reason of the console's own) and its text.
class Refusal : public std::runtime_error {
 public:
  explicit Refusal(const String& description, Long number = 0) : std::runtime_error(description), number_(number) {}
  Long number() const { return number_; }

 private:
  Long number_;
};

// A command that was called in a way that it can't work: exit code 2.
class Misuse : public std::runtime_error {
 public:
  using std::runtime_error::runtime_error;
};

// Takes the failure of a library object over where an operation on it gave its negative result.
template <class Object>
void require(bool done, const Object& object) {
  if (!done) throw Refusal(object.errDescription(), object.errNumber());
}

// "0x80040452"; a run-time's number as it is.
String numberText(Long number);

// A value as a person reads it: yes and no for truth values, nothing for null.
String shown(const Json& value);

// "1 session", "2 sessions".
String counted(std::size_t count, const String& noun);

}  // namespace QVSa::console
