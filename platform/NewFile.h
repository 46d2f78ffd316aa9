#pragma once

#include <filesystem>
#include <optional>
#include <string_view>
#include <sys/stat.h>

#include "QVSa/values/Values.h"
#include "platform/FileDescriptor.h"

namespace QVSa::platform {

// A file that is written piece by piece and takes its place at the end: nobody ever sees a part of it, and whatever
// fails before leaves the place as it was.
//   NewFile file(path);  file.write(text);  file.keep();
// It is written beside its place and renamed, with the owner and the mode of the file that it replaces. A link is
// followed; in a folder where others may write it has to be the caller's own.
// What can't be replaced is written straight at the end, out of the temporary folder: a terminal, a pipe or a device,
// and a file whose folder can't be written or whose owner could not be kept.
//
// Throws Failure, with the system's own number as the native one: 75 for a path without a file's name or with a NUL
// byte, a folder, a pipe that nobody comes to read; 70 for what may not be written, a link of somebody else's, and a
// file of an installation; 76 path not found.
class NewFile {
 public:
  enum class Writers {
    any,  // the last one to keep its file wins
    // A second one is refused while the first is writing, and takes over what a killed one left. The file may be
    // written by its name. No access for others, as long as it replaces none.
    one
  };

  explicit NewFile(const String& path, Writers writers = Writers::any);
  ~NewFile();
  NewFile(const NewFile&) = delete;
  NewFile& operator=(const NewFile&) = delete;

  // Where the content is until it is kept.
  const std::filesystem::path& name() const { return beside_->name; }
  void write(std::string_view bytes);
  void keep();

  // The file that is written, and what SQLite keeps beside it: made with both names, since what must go
  // has to go without memory.
  struct NameBeside {
    explicit NameBeside(std::filesystem::path file);
    void discard() const noexcept;

    std::filesystem::path name;
    std::filesystem::path journal;
  };

 private:
  int openBeside(Writers writers, const struct stat* old);
  void openInTemporaryFolder();
  void copyToTarget();
  [[noreturn]] void fail(int systemError) const;

  std::filesystem::path target_;
  std::optional<NameBeside> beside_;  // nothing once it is kept
  FileDescriptor file_;
  FileDescriptor straight_;  // the target, where it can't be replaced
};

// Whether the name of a file is on the disk with it; true as well where the folder is none that can be synced, which is
// no failure: the file is in its place already. False leaves the reason in errno.
bool syncFolderOf(const std::filesystem::path& file);

// Removes what a killed writer that was the only one left beside its target, and its journal. Leaves alone what is
// being written, and is silent on what it can't remove.
void removeUnfinished(const String& target);

// The path behind the links that it leads over, there or not. Throws Failure 70 for a link of somebody else's in a
// folder where others may write.
std::filesystem::path behindLinks(const std::filesystem::path& path);

}  // namespace QVSa::platform
