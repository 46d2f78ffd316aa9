#include <memory>

#include "QVSa/QVSa.h"
#include "bench/Office.h"
#include "bench/Operations.h"
#include "bench/Pairs.h"
#include "bench/UserFloor.h"

namespace QVSa::bench {

namespace {

// A floor with the files that it stands on.
struct OpenFloor {
  explicit OpenFloor(const Office& where = office()) : storage(where.folder()) {}

  Storage storage;
  UserFloor users{storage};
};

std::shared_ptr<User> ann(const Office& where = office()) {
  auto user = std::make_shared<User>();
  user->connect(where.server(), "QVApp");
  return user;
}

Call signOn() {
  auto user = ann();
  auto sessions = std::make_shared<Sessions>();
  sessions->connect(office().server(), "QVApp");
  auto id = std::make_shared<String>();
  return {[user, id] {
            require(user->loginAuth(Office::login, Office::password, id.get(), false, "", Office::host), *user);
          },
          [sessions, id] { require(sessions->Terminate(*id), *sessions); }};
}

Call signOnFloor() {
  auto floor = std::make_shared<OpenFloor>();
  auto id = std::make_shared<std::string>();
  return {[floor, id] { *id = floor->users.signOn(Office::login, Office::password, Office::host); },
          [floor, id] { floor->users.endSession(*id); }};
}

Call load(const Office& where) {
  return {[user = ann(where)] { require(user->GetOne(3, Office::login), *user); }};
}

Call loadFloor(const Office& where) {
  return {[floor = std::make_shared<OpenFloor>(where)] { floor->users.load(Office::login); }};
}

Call save() {
  auto user = ann();
  require(user->GetOne(3, Office::login), *user);
  user->setJobs("2,4");
  return {[user] { require(user->Save(), *user); }};
}

Call saveFloor() {
  auto floor = std::make_shared<OpenFloor>();
  return {[floor, user = floor->users.load(Office::login)] { floor->users.save(user, 2, 4, "Writers"); }};
}

}  // namespace

void addUserPairs() {
  addPair("User.loginAuth, 1,000 sessions open", signOn, signOnFloor);
  addPair(
      "User.GetOne", [] { return load(office()); }, [] { return loadFloor(office()); });
  addPair(
      "User.GetOne, 100,000 departments", [] { return load(largeOffice()); }, [] { return loadFloor(largeOffice()); });
  addPair("User.Save", save, saveFloor);
}

}  // namespace QVSa::bench
