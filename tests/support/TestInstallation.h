#pragma once

#include <filesystem>
#include <string>

namespace QVSa::test {

// An installation, with the databases as they are shipped or empty. On the embedded engine it lies in a folder of its
// own, on a memory-backed file system where there is one, and goes with the object. On a server (see TestServer) there
// is one at a time.
class TestInstallation {
 public:
  static constexpr const char* administratorPassword = "test-admin";  // of the log-in sa of the embedded engine

  enum class Content { shipped, empty };
  explicit TestInstallation(Content content = Content::shipped);
  ~TestInstallation();
  TestInstallation(const TestInstallation&) = delete;
  TestInstallation& operator=(const TestInstallation&) = delete;

  // Of the embedded engine alone.
  const std::filesystem::path& folder() const;
  // As `connect` of the public classes takes it.
  std::string server() const;
  // The connection string of the log-in sa.
  std::string administratorString(const std::string& database) const;

 private:
  std::filesystem::path folder_;
};

// A folder of its own that goes with the object.
class TestFolder {
 public:
  TestFolder();
  ~TestFolder();
  TestFolder(const TestFolder&) = delete;
  TestFolder& operator=(const TestFolder&) = delete;
  const std::filesystem::path& path() const { return path_; }

 private:
  std::filesystem::path path_;
};

}  // namespace QVSa::test
