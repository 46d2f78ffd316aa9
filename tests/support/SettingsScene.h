#pragma once

#include "tests/support/Scene.h"

namespace QVSa::test {

// An installation with its settings, and a machine of its own: the program's folder, and no settings store.
class SettingsScene : public Scene {
 protected:
  SettingsScene() : services_(platform::services()) {
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

  String stored(const String& column) { return tables_.text("select " + column + " from homeinfo where id=1"); }
  void store(const String& assignments) { tables_.run("update homeinfo set " + assignments + " where id=1"); }

  platform::Services services_;
  TestFolder programFolder_;
};

}  // namespace QVSa::test
