#pragma once

#include <optional>

#include "QVSa/values/Values.h"

namespace QVSa {

// What locks a copy: the reports that count as hidden after a restore, and the password that lifts the lock. A column
// holds it as one encrypted text.
struct BackupLock {
  String list;  // report ids joined with "."
  String pwd;

  // No lock where the text is empty or can't be decrypted.
  static std::optional<BackupLock> read(const String& cipher);
  String cipher() const;
};

}  // namespace QVSa
