#pragma once

#include <filesystem>
#include <optional>
#include <string_view>

#include "QVSa/frame/Date.h"
#include "QVSa/frame/Values.h"

namespace QVSa::platform {

// A path as texts of the system hold it: "\" and "/" both separate. Texts that go to the database stay as they are.
std::filesystem::path localPath(const String& path);

// All of these throw Failure with the run-time's numbers: 53 file not found, 76 path not found, 70 access denied, 75
// path/file access.

// A whole file in binary.
Bytes readFile(const String& path);
// The file is complete or not there, as NewFile has it.
void writeFile(const String& path, const Bytes& content);
// When the file was last modified, in the machine's local time; nothing where there is none.
std::optional<Date> lastModified(const String& path);
// Deletes the file; one that is not there is no failure. Throws as readFile does.
void deleteFile(const String& path);

// For who writes a file beside its target and renames it. Why a file of this name can't be replaced, as the system's
// error number; 0 where it can. The target is replaced and not opened, so its own permission has to be asked for.
int reasonAgainstReplacing(const std::filesystem::path& target);
// Whether the name of a file is on the disk with it; true as well where the folder is none that can be synced, which is
// no failure: the file is in its place already. False leaves the reason in errno.
bool syncFolderOf(const std::filesystem::path& file);

// A file that is written piece by piece beside its target and takes its place at the end: nobody ever sees a part of
// it. A path without a file's name, and a target that is there and can't be written or is no plain file, are refused at
// once.
class NewFile {
 public:
  explicit NewFile(const String& path);
  // What was not kept is gone, and the target as it was.
  ~NewFile();
  NewFile(const NewFile&) = delete;
  NewFile& operator=(const NewFile&) = delete;

  void write(std::string_view bytes);
  void keep();

 private:
  std::filesystem::path target_;
  std::filesystem::path beside_;
  int handle_;
};

}  // namespace QVSa::platform
