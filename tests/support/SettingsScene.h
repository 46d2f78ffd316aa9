#pragma once

#include "tests/support/Scene.h"

namespace QVSa::test {

// An installation with its settings, and a machine of its own: the program's folder, and no settings store.
class SettingsScene : public Scene {
 protected:
  SettingsScene() {
    replace(&platform::Services::programFolder, {[this] { return programFolder_.path().string(); }});
    replace(&platform::Services::openSettings, {[](const String&) { return nullptr; }});
  }

  String stored(const String& column) { return tables_.text("select " + column + " from homeinfo where id=1"); }
  void store(const String& assignments) { tables_.run("update homeinfo set " + assignments + " where id=1"); }

  TestFolder programFolder_;
};

}  // namespace QVSa::test
