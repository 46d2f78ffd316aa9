#pragma once

#include "QVSa/identity/User.h"

namespace QVSa {

// Saves of a stored user that change what was set on the object and nothing else: User::Save takes his jobs from
// setJobs and one group, begins the validity of his password anew, and unlocks a locked account.
//   UserKeeping keeping;  keeping.connect(server, "QVApp");
//   user.Email("ann@example.org");  if (!keeping.save(user)) complain(keeping.errDescription());
class QVSA_EXPORT UserKeeping : private Frame {
 public:
  using Frame::connect;
  using Frame::errDescription;
  using Frame::errNumber;

  // Saves `user`, loaded before. Jobs and groups stay as the tables have them, whatever setJobs and grpName say, and so
  // do the state of the account, the date of its lock and, without a `newPassword`, that of the password. These are
  // read before User::Save and put back behind it: for a moment a locked account is open, and he is in no group. Where
  // that can't be done, the text begins with "The user is saved, but"; the refusals of the save are User::Save's.
  Boolean save(User& user, Boolean newPassword = false);
  // Opens the account of user `userId` where it is locked, and forgets his failed sign-ons; password, jobs and groups
  // are not touched. userUnknown (0x8004044D) there is no such user, or his application waits or was refused.
  Boolean unlock(Long userId);

 private:
  struct Kept;

  String jobsOf(Long userId);
  Kept read(Connection& connection, Long userId);
  void putBack(Connection& connection, const User& user, const Kept& kept, Boolean newPassword);
};

}  // namespace QVSa
