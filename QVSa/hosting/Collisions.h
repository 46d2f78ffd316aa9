#pragma once

#include <chrono>
#include <type_traits>

#include "QVSa/values/Values.h"

namespace QVSa {

// Whether these error values tell of a collision: somebody else took a number at the same moment (the key of `idRec`,
// `seslog` or `syslog` refused the row), or the server ended the call as the victim of a deadlock. Nothing was stored
// then, and trying again is safe. A deadlock is known by the server's English text.
QVSA_EXPORT Boolean isCollision(Long errNumber, const String& errDescription);

// How often a call is made, and how long the pauses are: random, up to `pause` before the second try, up to twice as
// long before each further one, and never above `longest`. By default a call gives up after some 10 seconds.
class QVSA_EXPORT Repetition {
 public:
  explicit Repetition(Integer tries = 100, std::chrono::milliseconds pause = std::chrono::milliseconds(4),
                      std::chrono::milliseconds longest = std::chrono::milliseconds(256))
      : left_(tries), pause_(pause), longest_(longest) {}

  // Pauses before the next try; False at once where none is left.
  Boolean again();

 private:
  Integer left_;
  std::chrono::milliseconds pause_;
  std::chrono::milliseconds longest_;
};

// Makes `call`, an operation of `object`, again while it collides, and gives its last result; the object then has the
// last error values. For every call that takes a number: IdMgr::newId and setStartNo, LogRecords::Add,
// Sessions::newSession, User::loginAuth.
//   String number = repeatCollided(rule, [&] { return rule.newId("invoice"); });
// Not for BKPlan::exec, which would back up once more: see PlanRuns.
template <class Object, class Call>
auto repeatCollided(const Object& object, Call&& call, Repetition repetition = Repetition()) {
  for (;;) {
    auto result = call();
    bool done;
    if constexpr (std::is_same_v<decltype(result), String>) {
      done = !result.empty();
    } else {
      done = static_cast<bool>(result);
    }
    if (done || !isCollision(object.errNumber(), object.errDescription()) || !repetition.again()) return result;
  }
}

}  // namespace QVSa
