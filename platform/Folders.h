#pragma once

#include <vector>

#include "QVSa/values/Values.h"

namespace QVSa::platform {

// Files and folders by their paths as texts of the system hold them; names without a path. Throw Failure with the
// run-time's numbers: 58 exists already, 70 access denied, 75 path/file access, 76 path not found.
bool fileExists(const String& path);
bool folderExists(const String& path);
// One level: the folder above it has to be there.
void makeFolder(const String& path);
// In the order of their names.
std::vector<String> foldersIn(const String& path);
std::vector<String> filesIn(const String& path);
// With all that is in it.
void removeFolder(const String& path);

}  // namespace QVSa::platform
