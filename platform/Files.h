#pragma once

#include <filesystem>

#include "QVSa/frame/Values.h"

namespace QVSa::platform {

// A path as texts of the system hold it: "\" and "/" both separate. Texts that go to the database stay as they are.
std::filesystem::path localPath(const String& path);

// Whole files in binary. Throw Failure with the run-time's numbers: 53 file not found, 76 path not found, 70 access
// denied, 75 path/file access.
Bytes readFile(const String& path);
// Writes beside the target, then renames: the file is complete or not there.
void writeFile(const String& path, const Bytes& content);

}  // namespace QVSa::platform
