#pragma once

#include "bench/NumberFloor.h"

namespace QVSa::bench {

// Loading, saving and signing on a user by hand.
class UserFloor {
 public:
  explicit UserFloor(const Storage& storage);

  // The user with his organisation, roles and groups.
  struct Loaded {
    Row user;
    std::string password;
    Row organisation;
    std::vector<Row> roles;
    std::vector<Row> groups;
  };
  Loaded load(const std::string& login);
  // With two jobs and one group.
  void save(const Loaded& user, std::int64_t jobA, std::int64_t jobB, const std::string& group);
  // Gives the session id.
  std::string signOn(const std::string& login, const std::string& password, const std::string& host);
  void endSession(const std::string& id);

 private:
  Loaded readUser(const std::string& login);
  void readRights(Loaded& loaded);
  void requireNoOtherHost(const std::string& login, const std::string& host);

  NumberFloor numbers_;
  Query user_;
  Query organisation_;
  Query roles_;
  Query groups_;
  Query resetCounter_;
  Query sessions_;
  Query policy_;
  Query addSession_;
  Query endSession_;
  Query history_;
  Query update_;
  Query removeJobs_;
  Query addJobs_;
  Query removeGroups_;
  Query addGroup_;
  Query begin_;
  Query commit_;
};

}  // namespace QVSa::bench
