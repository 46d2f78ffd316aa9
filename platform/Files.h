#pragma once

#include <filesystem>
#include <optional>

#include "QVSa/values/Date.h"
#include "QVSa/values/Values.h"

namespace QVSa::platform {

// A path as texts of the system hold it: "\" and "/" both separate. Texts that go to the database stay as they are.
// Throws 75 for one with a NUL byte.
std::filesystem::path localPath(const String& path);

// All of these throw Failure with the run-time's numbers, and the system's own as the native one: 53 file not found, 76
// path not found, 70 access denied, 75 path/file access.

// A whole file in binary.
Bytes readFile(const String& path);
// The file is complete or not there, as NewFile has it.
void writeFile(const String& path, const Bytes& content);
// When the file was last modified, in the machine's local time; nothing where there is none.
std::optional<Date> lastModified(const String& path);
// Deletes the file; one that is not there is no failure. Throws as readFile does.
void deleteFile(const String& path);

}  // namespace QVSa::platform
