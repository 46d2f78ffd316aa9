#pragma once

#include <filesystem>

#include "QVSa/values/Failure.h"

namespace QVSa::platform {

// The run-time failure that an error of the system means, with its number as the native one: 53 no such file, 76 no
// such folder, 58 it exists already, 70 not permitted, 75 anything else.
Failure fileFailure(int systemError, const std::filesystem::path& file);
Failure folderFailure(int systemError);

}  // namespace QVSa::platform
