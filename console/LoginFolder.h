#pragma once

#include <filesystem>

#include "platform/Services.h"

namespace QVSa::console {

// While it lives, the pictures of the login screen are fetched into `folder` instead of the program's own, and the
// machine's settings store is left alone.
class LoginFolder {
 public:
  explicit LoginFolder(const std::filesystem::path& folder);
  ~LoginFolder();
  LoginFolder(const LoginFolder&) = delete;
  LoginFolder& operator=(const LoginFolder&) = delete;

 private:
  platform::Services before_;
};

// A folder for this user alone that goes with the object.
class PrivateFolder {
 public:
  PrivateFolder();
  ~PrivateFolder();
  PrivateFolder(const PrivateFolder&) = delete;
  PrivateFolder& operator=(const PrivateFolder&) = delete;
  const std::filesystem::path& path() const { return path_; }

 private:
  std::filesystem::path path_;
};

}  // namespace QVSa::console
