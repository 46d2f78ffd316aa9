#include "platform/SettingsStore.h"

#include <cstdlib>

#include "QVSa/values/Failure.h"
#include "platform/Files.h"

namespace QVSa::platform {
namespace {

// A name that leads out of its folder belongs to no key.
bool isPlain(const std::filesystem::path& part) { return part != "." && part != ".." && !part.is_absolute(); }

// An answer that the system refuses is no No: a text that protects something must not count as absent.
bool mayBeFolder(const std::filesystem::path& path) {
  std::error_code refused;
  const std::filesystem::file_type type = std::filesystem::status(path, refused).type();
  return type == std::filesystem::file_type::directory || type == std::filesystem::file_type::none;
}

class Folder : public SettingsKey {
 public:
  explicit Folder(std::filesystem::path path) : path_(std::move(path)) {}

  std::optional<String> value(const String& name) const override {
    try {
      const Bytes content = readFile(fileOf(name));
      return String(content.begin(), content.end());
    } catch (const Failure& failure) {
      if (failure.number() == number::noFile) return std::nullopt;
      throw;
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
  if (!mayBeFolder(folder)) return nullptr;
  return std::make_unique<Folder>(std::move(folder));
}

}  // namespace QVSa::platform
