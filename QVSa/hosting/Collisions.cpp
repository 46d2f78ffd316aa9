#include "QVSa/hosting/Collisions.h"

#include <algorithm>
#include <random>
#include <thread>

#include "QVSa/values/Failure.h"
#include "QVSa/values/Text.h"

namespace QVSa {

namespace {

bool isTableOfNumbers(const String& name) {
  const String table = name.substr(name.rfind('.') + 1);
  return sameText(table, "idRec") || sameText(table, "seslog") || sameText(table, "syslog");
}

// A duplicate key is told with two names in quotes, the table among them, in every language of a server. Behind these
// the key itself may stand, which is a text of anybody's. A refused NULL has its table in quotes as well.
bool isDuplicateNumber(const String& description) {
  const std::vector<String> parts = split(description, '\'');
  if (parts.size() < 3 || parts[0].find("NULL") != String::npos) return false;
  return isTableOfNumbers(parts[1]) || (parts.size() > 4 && isTableOfNumbers(parts[3]));
}

}  // namespace

Boolean isCollision(Long errNumber, const String& errDescription) {
  if (errNumber == number::integrity) return isDuplicateNumber(errDescription);
  return errNumber == number::general && errDescription.find("deadlock") != String::npos;
}

Boolean Repetition::again() {
  if (--left_ <= 0) return false;
  thread_local std::minstd_rand random{std::random_device{}()};
  using Microseconds = std::chrono::microseconds;
  const Microseconds most = pause_;
  std::this_thread::sleep_for(Microseconds(std::uniform_int_distribution<std::int64_t>(0, most.count())(random)));
  pause_ = std::min(2 * pause_, longest_);
  return true;
}

}  // namespace QVSa
