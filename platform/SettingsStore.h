#pragma once

#include <memory>
#include <optional>

#include "QVSa/values/Values.h"

namespace QVSa::platform {

// Named texts that a machine keeps under a key.
class SettingsKey {
 public:
  virtual ~SettingsKey() = default;
  // Nothing where there is none; throws Failure where it is there and can't be read.
  virtual std::optional<String> value(const String& name) const = 0;
  // False where the store refuses it.
  virtual bool write(const String& name, const String& text) = 0;
  // True also where there was none.
  virtual bool remove(const String& name) = 0;
};

// The key `path`, its parts separated by "\": a folder below QVSA_SETTINGS (an environment variable; /etc/qvsa where it
// is not set), with one file a text. Nothing where there is no such folder: a machine takes part by having it made. A
// folder that this account may not look for gives a key that refuses everything.
std::unique_ptr<SettingsKey> openSettings(const String& path);

}  // namespace QVSa::platform
