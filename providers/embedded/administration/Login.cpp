#include "providers/embedded/administration/Login.h"

#include <algorithm>
#include <mutex>
#include <vector>

#include "platform/Fingerprint.h"
#include "platform/PasswordDigest.h"
#include "platform/SecretMessage.h"
#include "providers/tsql/SqlFailure.h"

namespace QVSa::embedded {

namespace {

// Fingerprints of the log-ins that were checked in this process.
class CheckedLogins {
 public:
  bool contains(const Bytes& fingerprint) {
    const std::lock_guard guard(mutex_);
    return std::find(known_.begin(), known_.end(), fingerprint) != known_.end();
  }

  void add(const Bytes& fingerprint) {
    const std::lock_guard guard(mutex_);
    // A process has a log-in or two; who tries thousands pays the slow way again.
    if (known_.size() >= most) known_.clear();
    known_.push_back(fingerprint);
  }

 private:
  static constexpr std::size_t most = 64;

  std::mutex mutex_;
  std::vector<Bytes> known_;
};

CheckedLogins& checkedLogins() {
  // Never destroyed: a host may call with its last statics.
  static auto& theLogins = *new CheckedLogins();
  return theLogins;
}

// Of a name or a digest with its password. The digest is salted: the same one for the same password means the same
// log-in.
Bytes fingerprintOf(const std::string& owner, const std::string& password) {
  std::string text = owner + '\0' + password;
  const Bytes result = platform::fingerprint(text);
  platform::clearSecret(text);
  return result;
}

void checkAgainstDigest(const std::string& digest, const std::string& user, const std::string& password) {
  const Bytes fingerprint = fingerprintOf(digest, password);
  if (checkedLogins().contains(fingerprint)) return;
  if (!platform::passwordMatches(password, digest))
    throw tsql::sqlFailure(18456, "Login failed for user '" + user + "'.");
  checkedLogins().add(fingerprint);
}

}  // namespace

void checkLogin(Handle& handle, const std::string& user, const std::string& password) {
  const std::uint64_t mark = handle.mark().value();
  const Bytes fingerprint = fingerprintOf(user, password);
  auto& checked = handle.checkedLogin();
  if (checked && checked->mark == mark && checked->fingerprint == fingerprint) return;
  checkAgainstDigest(handle.loginDigest(user), user, password);
  if (CatalogueMark::isSettled(mark)) checked = {mark, fingerprint};
}

}  // namespace QVSa::embedded
