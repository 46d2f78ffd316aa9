#include "platform/SettingsStore.h"

#include <cstdlib>

#include "QVSa/frame/Failure.h"
#include "platform/Files.h"

namespace QVSa::platform {
namespace {

// A name that leads out of its folder belongs to no key.
bool isPlain(const std::filesystem::path& part) { return part != "." && part != ".." && !part.is_absolute(); }

class Folder : public SettingsKey {
 public:
  explicit Folder(std::filesystem::path path) : path_(std::move(path)) {}

  std::optional<String> value(const String& name) const override {
    try {
      const Bytes content = readFile(fileOf(name));
      return String(content.begin(), content.end());
    } catch (const Failure&) {
      return std::nullopt;
    }
  }

  bool write(const String& name, const String& text) override {
    try {
      writeFile(fileOf(name), Bytes(text.begin(), text.end()));
      return true;
    } catch (const Failure&) {
      return false;
    }
  }

  bool remove(const String& name) override {
    std::error_code error;
    std::filesystem::remove(fileOf(name), error);
    return !error;
  }

 private:
  String fileOf(const String& name) const { return (path_ / std::filesystem::path(name).filename()).string(); }

  std::filesystem::path path_;
};

}  // namespace

std::unique_ptr<SettingsKey> openSettings(const String& path) {
  const char* root = std::getenv("QVSA_SETTINGS");
  std::filesystem::path folder = root == nullptr ? "/etc/qvsa" : root;
  for (const std::filesystem::path& part : localPath(path)) {
    if (!isPlain(part)) return nullptr;
    folder /= part;
  }
  std::error_code ignored;
  if (!std::filesystem::is_directory(folder, ignored)) return nullptr;
  return std::make_unique<Folder>(std::move(folder));
}

}  // namespace QVSa::platform
