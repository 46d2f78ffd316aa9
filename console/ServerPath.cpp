#include "console/ServerPath.h"

#include <filesystem>

namespace QVSa::console {

String serverPath(const Console& console, const String& path) {
  if (!folderOf(console.place().server)) return path;
  return std::filesystem::absolute(path).lexically_normal().string();
}

}  // namespace QVSa::console
