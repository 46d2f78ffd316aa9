#include "platform/SystemFailure.h"

#include <cerrno>

namespace QVSa::platform {

namespace {

constexpr Long existsAlready = 58;

}  // namespace

Failure fileFailure(int systemError, const std::filesystem::path& file) {
  std::error_code ignored;
  const bool fileIsMissing =
      systemError == ENOENT && (!file.has_parent_path() || std::filesystem::is_directory(file.parent_path(), ignored));
  return fileIsMissing ? runtimeFailure(number::noFile, systemError) : folderFailure(systemError);
}

Failure folderFailure(int systemError) {
  switch (systemError) {
    case EEXIST:
      return runtimeFailure(existsAlready, systemError);
    case ENOENT:
    case ENOTDIR:
      return runtimeFailure(number::noPath, systemError);
    case EACCES:
    case EPERM:
    case EROFS:
      return runtimeFailure(number::accessDenied, systemError);
    default:
      return runtimeFailure(number::pathAccess, systemError);
  }
}

}  // namespace QVSa::platform
