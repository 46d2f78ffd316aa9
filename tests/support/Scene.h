#pragma once

#include <functional>
#include <gtest/gtest.h>

#include "QVSa/QVSa.h"
#include "tests/support/FakeClock.h"
#include "tests/support/PlainSession.h"
#include "tests/support/TestInstallation.h"
#include "tests/support/TestServer.h"

namespace QVSa::test {

// An installation as it is shipped, on the morning of 7 March 2024.
class Scene : public testing::Test {
 protected:
  template <class Class>
  Class connected(const String& database = "QVApp") {
    Class object;
    object.connect(server(), database);
    return object;
  }

  void savePolicy(const std::function<void(safeRule&)>& change) {
    auto rule = connected<safeRule>();
    ASSERT_TRUE(rule.GetOne());
    change(rule);
    ASSERT_TRUE(rule.Save()) << rule.errDescription();
  }

  // A user of the password "right"; his name is the login with a capital.
  void addUser(
      const String& login, const std::function<void(User&)>& change = [](User&) {}) {
    auto user = connected<User>();
    user.Name(upperCase(login.substr(0, 1)) + login.substr(1));
    user.Login(login);
    user.Pwd("right");
    change(user);
    ASSERT_TRUE(user.Save()) << user.errDescription();
  }

  User loaded(const String& login) {
    auto user = connected<User>();
    EXPECT_TRUE(user.GetOne(3, login)) << user.errDescription();
    return user;
  }

  // The number that a call of the object failed with; 0 where it was done.
  template <class Class>
  static Long refusal(const Class& object, Boolean done) {
    return done ? 0 : object.errNumber();
  }

  String server() const { return installation_.server(); }

  // A service of the machine for this test; its own come back with the clock's end.
  template <class Service>
  static void replace(Service platform::Services::*member, Service service) {
    platform::Services services = platform::services();
    services.*member = std::move(service);
    platform::replaceServices(services);
  }

  FakeClock clock_{Date(2024, 3, 7, 10, 0, 0)};
  TestInstallation installation_;
  PlainSession tables_{installation_.server()};
};

// A scene that looks into the installation's files, or has backups made on this machine.
class FilesScene : public Scene {
 protected:
  void SetUp() override {
    if (onServer()) GTEST_SKIP() << "the files of a server are out of reach";
  }
};

}  // namespace QVSa::test
