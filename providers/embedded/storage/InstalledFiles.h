#pragma once

#include <array>
#include <filesystem>
#include <sys/stat.h>

#include "providers/embedded/storage/Layout.h"

namespace QVSa::embedded {

// Which files an installation's folder had when they were opened, so that a handle can tell whether it still has them.
class InstalledFiles {
 public:
  explicit InstalledFiles(const std::filesystem::path& folder);

  // Whether all of them are still there. Next to free while nothing in the folder changes: whoever puts another file in
  // the place of one, or moves the folder, changes its time or its number.
  bool areCurrent();

 private:
  struct Identity {
    dev_t device = 0;
    ino_t number = 0;
    friend bool operator==(const Identity&, const Identity&) = default;
  };
  using Identities = std::array<Identity, databaseNames.size()>;

  Identities look() const;

  std::filesystem::path folder_;
  Identities files_;
  Identity folderThen_;
  timespec changedThen_{};  // when the folder had last changed before the files were found right in it
};

}  // namespace QVSa::embedded
