#pragma once

#include <filesystem>
#include <stdlib.h>
#include <string>

#include "providers/Installation.h"
#include "providers/embedded/storage/Pool.h"

namespace QVSa::embedded {

// A folder that goes with the object, and in it, under "data", an installation with empty databases if wanted.
class InstallationFolder {
 public:
  explicit InstallationFolder(bool filled = true) {
    std::string path =
        (std::filesystem::is_directory("/dev/shm") ? "/dev/shm" : std::filesystem::temp_directory_path()) /
        std::filesystem::path("qvsa-storage-XXXXXX");
    root_ = ::mkdtemp(path.data());
    if (filled) createInstallation(plan());
  }
  ~InstallationFolder() {
    discardIdleHandle(data());
    std::error_code ignored;
    std::filesystem::remove_all(root_, ignored);
  }
  InstallationFolder(const InstallationFolder&) = delete;
  InstallationFolder& operator=(const InstallationFolder&) = delete;

  const std::filesystem::path& root() const { return root_; }
  std::filesystem::path data() const { return root_ / "data"; }
  InstallationPlan plan() const { return {data(), "user-password", "sa-password", {}}; }

 private:
  std::filesystem::path root_;
};

}  // namespace QVSa::embedded
