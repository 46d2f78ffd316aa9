#pragma once

#include <gtest/gtest.h>

#include "QVSa/settings/Home.h"
#include "platform/Services.h"
#include "tests/support/PlainSession.h"
#include "tests/support/TestInstallation.h"

namespace QVSa::test {

// An installation with its settings, and a machine of its own: the program's folder, and no settings store.
class SettingsScene : public ::testing::Test {
 protected:
  SettingsScene() : services_(platform::services()), plain_(installation_.server()) {
    platform::Services services = services_;
    services.programFolder = [this] { return programFolder_.path().string(); };
    services.openSettings = [](const String&) { return nullptr; };
    platform::replaceServices(services);
  }
  ~SettingsScene() override { platform::replaceServices(services_); }

  template <class Service>
  static void replace(Service platform::Services::*member, Service service) {
    platform::Services services = platform::services();
    services.*member = std::move(service);
    platform::replaceServices(services);
  }

  template <class Object>
  Object connected() {
    Object object;
    EXPECT_TRUE(object.connect(installation_.server(), "QVApp")) << object.errDescription();
    return object;
  }
  String stored(const String& column) { return plain_.text("select " + column + " from homeinfo where id=1"); }
  void store(const String& assignments) { plain_.run("update homeinfo set " + assignments + " where id=1"); }

  platform::Services services_;
  TestInstallation installation_;
  TestFolder programFolder_;
  PlainSession plain_;
};

}  // namespace QVSa::test
