#include "console/ServerPath.h"

#include <filesystem>

namespace QVSa::console {

String serverPath(const Console& console, const String& path) {
  if (!folderOf(console.place().server)) return path;
  return std::filesystem::absolute(path).lexically_normal().string();
}

String below(const Console& console, const String& folder, const String& name) {
  return folder + (folderOf(console.place().server) ? "/" : "\\") + name;
}

}  // namespace QVSa::console
