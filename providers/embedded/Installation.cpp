#include "providers/embedded/Installation.h"

#include <algorithm>
#include <array>
#include <cerrno>
#include <fcntl.h>
#include <linux/magic.h>
#include <sys/stat.h>
#include <sys/vfs.h>
#include <unistd.h>

#include "QVSa/frame/Failure.h"
#include "platform/PasswordDigest.h"
#include "providers/embedded/Definitions.h"
#include "providers/embedded/Pool.h"
#include "providers/embedded/Script.h"
#include "providers/embedded/StorageFailure.h"

namespace QVSa::embedded {

namespace {

namespace fs = std::filesystem;

constexpr Long fileExists = 58;
constexpr mode_t folderMode = S_ISGID | S_IRWXU | S_IRWXG;
constexpr mode_t fileMode = S_IRUSR | S_IWUSR | S_IRGRP | S_IWGRP;

[[noreturn]] void throwSystemFailure() {
  throw runtimeFailure(errno == EACCES || errno == EPERM || errno == EROFS ? number::accessDenied : number::pathAccess);
}

void require(bool done) {
  if (!done) throwSystemFailure();
}

class OpenFile {
 public:
  OpenFile(const fs::path& path, int flags) : file_(::open(path.c_str(), flags | O_CLOEXEC, fileMode)) {
    require(file_ >= 0);
  }
  ~OpenFile() { ::close(file_); }
  OpenFile(const OpenFile&) = delete;
  OpenFile& operator=(const OpenFile&) = delete;
  int get() const { return file_; }

 private:
  int file_;
};

// Its locks are not those that a database needs.
void refuseNetworkFileSystem(const fs::path& folder) {
  static constexpr std::array<unsigned long, 8> networkKinds = {NFS_SUPER_MAGIC,  SMB_SUPER_MAGIC, CIFS_SUPER_MAGIC,
                                                                SMB2_SUPER_MAGIC, AFS_SUPER_MAGIC, AFS_FS_MAGIC,
                                                                CODA_SUPER_MAGIC, V9FS_MAGIC};
  struct statfs system {};
  require(::statfs(folder.c_str(), &system) == 0);
  const auto kind = static_cast<unsigned long>(system.f_type) & 0xFFFFFFFFUL;
  if (std::find(networkKinds.begin(), networkKinds.end(), kind) != networkKinds.end())
    throw Failure(number::general, "SQL Server", "A database cannot lie on a network file system.");
}

// The name is finished when the folder is made.
std::string placeBeside(const fs::path& target) {
  return target.parent_path() / ("." + target.filename().string() + ".XXXXXX");
}

// The folder that is being built beside its place. It goes again unless it was moved there.
class BuildingSite {
 public:
  explicit BuildingSite(const fs::path& target) : target_(target) {
    std::string path = placeBeside(target);
    require(::mkdtemp(path.data()) != nullptr);
    path_ = path;
    struct stat existing {};
    if (::stat(target.c_str(), &existing) == 0 && ::chown(path_.c_str(), uid_t(-1), existing.st_gid) != 0) fail();
    if (::chmod(path_.c_str(), folderMode) != 0) fail();
  }
  ~BuildingSite() { remove(); }
  BuildingSite(const BuildingSite&) = delete;
  BuildingSite& operator=(const BuildingSite&) = delete;

  const fs::path& path() const { return path_; }

  void moveToTarget() {
    discardIdleHandle(path_);
    syncAll();
    require(::rename(path_.c_str(), target_.c_str()) == 0);
    path_.clear();
    require(::fsync(OpenFile(target_.parent_path(), O_RDONLY | O_DIRECTORY).get()) == 0);
  }

 private:
  [[noreturn]] void fail() {
    const int reason = errno;
    remove();
    errno = reason;
    throwSystemFailure();
  }

  void remove() {
    if (path_.empty()) return;
    discardIdleHandle(path_);
    std::error_code ignored;
    fs::remove_all(path_, ignored);
  }

  void syncAll() const {
    for (const auto& entry : fs::directory_iterator(path_))
      require(::fsync(OpenFile(entry.path(), O_RDONLY).get()) == 0);
    require(::fsync(OpenFile(path_, O_RDONLY | O_DIRECTORY).get()) == 0);
  }

  fs::path target_;
  fs::path path_;
};

void makeFile(const fs::path& path) {
  const OpenFile file(path, O_RDWR | O_CREAT | O_EXCL);
  require(::fchmod(file.get(), fileMode) == 0);
}

void makeDatabase(const fs::path& folder, std::size_t place) {
  const std::string database = databaseNames[place];
  makeFile(lockFile(folder, database));
  makeFile(databaseFile(folder, database));
  sqlite3* handle = nullptr;
  int code = sqlite3_open_v2(databaseFile(folder, database).c_str(), &handle, SQLITE_OPEN_READWRITE, nullptr);
  const std::unique_ptr<sqlite3, decltype(&sqlite3_close)> closer(handle, sqlite3_close);
  const std::string text =
      "pragma page_size=4096; pragma auto_vacuum=none; pragma encoding='UTF-8';"
      "pragma application_id=" +
      std::to_string(applicationId) + "; pragma user_version=" + std::to_string(place + 1) +
      ";"
      "pragma journal_mode=wal;"
      "create table engine(layout integer not null, catalogue integer not null);"
      "insert into engine values(" +
      std::to_string(layoutVersion) +
      ",0);"
      "create table gate(n integer);";
  if (code == SQLITE_OK) code = sqlite3_exec(handle, text.c_str(), nullptr, nullptr, nullptr);
  if (code != SQLITE_OK) throwStorageFailure(handle, code);
}

void addLogin(Handle& handle, const std::string& name, const std::string& password) {
  Prepared insert(handle.get(), "insert into master.logins(name,digest) values(?,?)");
  insert.bind(1, name);
  insert.bind(2, platform::makePasswordDigest(password));
  insert.step();
}

void fill(const fs::path& folder, const InstallationPlan& plan) {
  for (std::size_t i = 0; i < databaseNames.size(); ++i) makeDatabase(folder, i);
  {
    const PooledHandle handle = acquireHandle(folder);
    for (std::size_t i = 0; i < databaseNames.size(); ++i) {
      // The scripts run on this handle, too; the files are synced once, when they are complete.
      handle->execute(std::string("pragma ") + databaseNames[i] + ".synchronous=off");
      prepareDefinitions(*handle, i);
    }
    handle->execute("create table master.logins(name text collate tsql primary key, digest text not null)");
    addLogin(*handle, "QVUser", plan.userPassword);
    addLogin(*handle, "sa", plan.adminPassword);
  }
  for (const auto& script : plan.scripts) runScript(folder, script.database, script.script);
}

void makeParent(const fs::path& folder) {
  std::error_code error;
  fs::create_directories(folder, error);
  if (!error) return;
  errno = error.value();
  throwSystemFailure();
}

}  // namespace

void createInstallation(const InstallationPlan& plan) {
  fs::path target = fs::absolute(plan.folder).lexically_normal();
  if (!target.has_filename()) target = target.parent_path();
  std::error_code error;
  if (fs::exists(target, error) && !fs::is_empty(target, error)) throw runtimeFailure(fileExists);
  const std::size_t spare = placeBeside(target).size() - target.native().size();
  if (const std::string problem = lengthProblem(target, spare); !problem.empty())
    throw Failure(number::pathAccess, "SQL Server", "The installation cannot be made: " + problem + ".");
  makeParent(target.parent_path());
  refuseNetworkFileSystem(target.parent_path());
  BuildingSite site(target);
  fill(site.path(), plan);
  site.moveToTarget();
}

bool isInstallation(const std::filesystem::path& folder) {
  return std::all_of(databaseNames.begin(), databaseNames.end(), [&](const char* database) {
    std::error_code error;
    return fs::is_regular_file(databaseFile(folder, database), error);
  });
}

}  // namespace QVSa::embedded
