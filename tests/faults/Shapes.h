#pragma once

#include <memory>
#include <stdexcept>

#include "QVSa/resources/Messages.h"
#include "tests/faults/Operations.h"

namespace QVSa::test {

inline void require(Boolean done) {
  if (!done) throw std::logic_error("the ground of the test could not be made");
}

template <class Class>
String descriptionOf(const Class& object) {
  if constexpr (requires { object.errDesc(); })
    return object.errDesc();
  else
    return object.errDescription();
}

// An operation of a class that is connected first and prepared by `load`.
template <class Class>
Operation operation(const char* name, std::function<void(Class&)> load,
                    std::function<bool(Class&, const String& server)> run, std::vector<Report> reports = {},
                    bool atomic = false) {
  const auto prepare = [load, run](const String& server) -> std::function<Outcome()> {
    auto object = std::make_shared<Class>();
    object->connect(server, "QVApp");
    load(*object);
    return [object, run, server] {
      const bool positive = run(*object, server);
      return Outcome{positive, object->errNumber(), descriptionOf(*object)};
    };
  };
  return {name, prepare, std::move(reports), atomic};
}

template <class Class>
void nothing(Class&) {}

inline std::vector<Report> told(Long messageId, const String& blank = "") {
  return {{"", LoadResString(messageId) + blank}};
}

}  // namespace QVSa::test
