#pragma once

#include <memory>
#include <stdexcept>
#include <utility>

#include "QVSa/resources/Messages.h"
#include "tests/faults/Operations.h"

namespace QVSa::test {

// The operations come in parts, each with what it works on; the parts are filled in this order.
std::vector<Operation> logAndClassOperations();  // with the access rule and the template password
void fillLogAndClasses(const String& server);
std::vector<Operation> settingsOperations();  // with self-registration and the accounts that others vouch for
void fillSettings(const String& server);
std::vector<Operation> organisationOperations();  // but for the department itself
std::vector<LetPass> organisationLetPass();
void fillOrganisation(const String& server);
std::vector<Operation> maintenanceOperations();
std::vector<LetPass> maintenanceLetPass();
void fillMaintenance(const String& server);

inline void require(Boolean done) {
  if (!done) throw std::logic_error("the ground of the test could not be made");
}

inline void append(std::vector<Operation>& all, std::vector<Operation> part) {
  for (Operation& one : part) all.push_back(std::move(one));
}

// Where an operation works. Its texts are made beforehand: a call has no memory of its own.
struct Place {
  explicit Place(const String& where) : server(where) {}

  String server;
  String folder = server.substr(5);
  String sys = folder + "/sys", app = folder + "/app";
  String groundSys = folder + "/ground-sys", groundApp = folder + "/ground-app";
  String log = folder + "/log.txt";
};

template <class Class>
String descriptionOf(const Class& object) {
  if constexpr (requires { object.errDesc(); })
    return object.errDesc();
  else
    return object.errDescription();
}

// How an operation tells its failures, and whether it is one transaction.
struct Conduct {
  std::vector<Report> reports;
  bool isAtomic = false;
};

inline Conduct told(Long messageId, const String& blank = "") { return {{{"", LoadResString(messageId) + blank}}}; }

inline Conduct atomic(Conduct conduct = {}) { return {std::move(conduct.reports), true}; }

// An operation of a class that is connected first and prepared by `load`. `run` may take its place as well.
template <class Class, class Run>
Operation on(const char* name, Conduct conduct, std::function<void(Class&)> load, Run run) {
  const auto prepare = [load, run](const String& server) -> Call {
    auto object = std::make_shared<Class>();
    object->connect(server, "QVApp");
    if (load) load(*object);
    const auto call = [object, run, place = Place(server)]() -> bool {
      if constexpr (std::is_invocable_v<Run, Class&>)
        return run(*object);
      else
        return run(*object, place);
    };
    return {call, [object] { return object->errNumber(); }, [object] { return descriptionOf(*object); }};
  };
  return {name, prepare, std::move(conduct.reports), conduct.isAtomic};
}

template <class Class, class Run>
Operation on(const char* name, Conduct conduct, Run run) {
  return on<Class>(name, std::move(conduct), nullptr, run);
}

template <class Class, class Run>
Operation on(const char* name, Run run) {
  return on<Class>(name, Conduct{}, nullptr, run);
}

}  // namespace QVSa::test
