#pragma once

#include <unistd.h>
#include <utility>

namespace QVSa::platform {

// An open file of the system, closed with its holder; below 0 none.
class FileDescriptor {
 public:
  explicit FileDescriptor(int file = -1) : file_(file) {}
  FileDescriptor(FileDescriptor&& other) noexcept : file_(std::exchange(other.file_, -1)) {}
  FileDescriptor& operator=(FileDescriptor&& other) noexcept {
    std::swap(file_, other.file_);
    return *this;
  }
  ~FileDescriptor() {
    if (isOpen()) ::close(file_);
  }

  bool isOpen() const { return file_ >= 0; }
  int get() const { return file_; }

 private:
  int file_;
};

}  // namespace QVSa::platform
