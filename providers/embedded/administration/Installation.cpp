#include "providers/Installation.h"

#include <algorithm>
#include <array>
#include <cerrno>
#include <fcntl.h>
#include <linux/magic.h>
#include <sys/stat.h>
#include <sys/vfs.h>
#include <vector>

#include "QVSa/values/Failure.h"
#include "platform/FileDescriptor.h"
#include "platform/NewFile.h"
#include "platform/PasswordDigest.h"
#include "platform/SystemFailure.h"
#include "providers/embedded/administration/Script.h"
#include "providers/embedded/storage/Definitions.h"
#include "providers/embedded/storage/Pool.h"
#include "providers/embedded/storage/StorageFailure.h"

namespace QVSa::embedded {

namespace {

namespace fs = std::filesystem;

constexpr Long fileExists = 58;
const std::string insideName = ".building";  // of the folder that is built in the empty one that is there
const std::string randomEnding = ".XXXXXX";
constexpr mode_t folderMode = S_ISGID | S_IRWXU | S_IRWXG;
constexpr mode_t fileMode = S_IRUSR | S_IWUSR | S_IRGRP | S_IWGRP;

void require(bool done) {
  if (!done) throw platform::folderFailure(errno);
}

platform::FileDescriptor openFile(const fs::path& path, int flags) {
  platform::FileDescriptor file(::open(path.c_str(), flags | O_CLOEXEC, fileMode));
  require(file.isOpen());
  return file;
}

struct stat stateOf(const fs::path& path) {
  struct stat state {};
  require(::stat(path.c_str(), &state) == 0);
  return state;
}

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

// The folder that is being built beside its place, with the owner and group of the empty one that is there, and then
// renamed. Where no folder can be renamed to that place, it is built inside the empty one, and its files move up. It
// goes again unless it came to its place.
class BuildingSite {
 public:
  explicit BuildingSite(const fs::path& target) : target_(target) {
    const fs::path above = target.parent_path();
    const bool isThere = fs::exists(target);
    const struct stat there = stateOf(isThere ? target : above);
    const uid_t owner = isThere ? there.st_uid : keep;
    const gid_t group = isThere ? there.st_gid : keep;
    const bool isMountPoint = isThere && there.st_dev != stateOf(above).st_dev;
    int reason = isMountPoint ? EBUSY : make(above / ("." + target.filename().string()), owner, group);
    isInside_ = reason != 0 && isThere;
    // None but the superuser gives files to somebody else.
    if (isInside_) reason = make(target / insideName, ::geteuid() == 0 ? owner : keep, group);
    if (reason != 0) throw platform::folderFailure(reason);
  }
  ~BuildingSite() { remove(); }
  BuildingSite(const BuildingSite&) = delete;
  BuildingSite& operator=(const BuildingSite&) = delete;

  const fs::path& path() const { return path_; }

  void moveToTarget() {
    discardIdleHandle(path_);
    giveAndSyncAll();
    if (isInside_) {
      moveUp();
    } else {
      require(::rename(path_.c_str(), target_.c_str()) == 0);
    }
    path_.clear();
    sync(isInside_ ? target_ : target_.parent_path());
  }

 private:
  static constexpr unsigned keep = static_cast<unsigned>(-1);  // the owner or the group

  // 0, or the system's reason.
  int make(const fs::path& name, uid_t owner, gid_t group) {
    std::string path = name.string() + randomEnding;
    if (::mkdtemp(path.data()) == nullptr) return errno;
    path_ = path;
    if (::chown(path_.c_str(), owner, group) == 0 && ::chmod(path_.c_str(), folderMode) == 0) return 0;
    const int reason = errno;
    remove();
    return reason;
  }

  // The files have the group of their folder already.
  void giveAndSyncAll() const {
    const uid_t owner = stateOf(path_).st_uid;
    for (const auto& entry : fs::directory_iterator(path_)) {
      const platform::FileDescriptor file = openFile(entry.path(), O_RDONLY);
      require(::fchown(file.get(), owner, keep) == 0 && ::fsync(file.get()) == 0);
    }
    sync(path_);
  }

  void moveUp() {
    // Somebody else may be building there as well.
    if (std::distance(fs::directory_iterator(target_), {}) != 1) throw runtimeFailure(fileExists);
    require(::chmod(target_.c_str(), folderMode) == 0);
    const std::vector<fs::directory_entry> files(fs::directory_iterator(path_), {});
    for (const fs::path& file : files) {
      moved_.push_back(target_ / file.filename());
      require(::rename(file.c_str(), moved_.back().c_str()) == 0);
    }
    require(::rmdir(path_.c_str()) == 0);
  }

  static void sync(const fs::path& folder) { require(::fsync(openFile(folder, O_RDONLY | O_DIRECTORY).get()) == 0); }

  void remove() {
    if (path_.empty()) return;
    discardIdleHandle(path_);
    std::error_code ignored;
    fs::remove_all(path_, ignored);
    for (const fs::path& file : moved_) fs::remove(file, ignored);
    path_.clear();
  }

  fs::path target_;
  fs::path path_;  // empty once it is in its place
  bool isInside_ = false;
  std::vector<fs::path> moved_;
};

void makeFile(const fs::path& path) {
  const platform::FileDescriptor file = openFile(path, O_RDWR | O_CREAT | O_EXCL);
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
  if (plan.lastStep) plan.lastStep(folder);
}

void makeParent(const fs::path& folder) {
  std::error_code error;
  fs::create_directories(folder, error);
  if (error) throw platform::folderFailure(error.value());
}

}  // namespace

void createInstallation(const InstallationPlan& plan) {
  fs::path target = fs::absolute(plan.folder).lexically_normal();
  if (!target.has_filename()) target = target.parent_path();
  target = platform::behindLinks(target);
  std::error_code error;
  if (fs::exists(target, error) && !fs::is_empty(target, error)) throw runtimeFailure(fileExists);
  const std::size_t spare = 1 + insideName.size() + randomEnding.size();
  if (const std::string problem = lengthProblem(target, spare); !problem.empty())
    throw Failure(number::pathAccess, "SQL Server", "The installation cannot be made: " + problem + ".");
  makeParent(target.parent_path());
  refuseNetworkFileSystem(fs::exists(target) ? target : target.parent_path());
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
