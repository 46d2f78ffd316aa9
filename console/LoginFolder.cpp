#include "console/LoginFolder.h"

#include <cstdlib>

#include "console/Answer.h"

namespace QVSa::console {

LoginFolder::LoginFolder(const std::filesystem::path& folder) : before_(platform::services()) {
  platform::Services services = before_;
  services.programFolder = [folder] { return folder.string(); };
  services.openSettings = [](const String&) { return nullptr; };
  platform::replaceServices(services);
}

LoginFolder::~LoginFolder() { platform::replaceServices(before_); }

PrivateFolder::PrivateFolder() {
  String name = (std::filesystem::temp_directory_path() / "qvsa-XXXXXX").string();
  if (mkdtemp(name.data()) == nullptr) throw Refusal("There is no place for a passing folder.");
  path_ = name;
}

PrivateFolder::~PrivateFolder() {
  std::error_code ignored;
  std::filesystem::remove_all(path_, ignored);
}

}  // namespace QVSa::console
