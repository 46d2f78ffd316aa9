#include <cstdlib>
#include <ctime>
#include <fcntl.h>
#include <fstream>
#include <memory>
#include <unistd.h>
#include <zlib.h>

#include "QVSa/QVSa.h"
#include "bench/Operations.h"
#include "bench/Pairs.h"
#include "bench/Storage.h"
#include "tests/support/TestInstallation.h"

namespace QVSa::bench {

namespace {

namespace fs = std::filesystem;

// QVSA_BENCH_MEGABYTES: 1024 for the size of a large site.
std::size_t megabytes() {
  const char* const wanted = std::getenv("QVSA_BENCH_MEGABYTES");
  return wanted == nullptr ? 32 : std::stoul(wanted);
}

// Databases of a size, and a file of the same size.
struct Ground {
  Ground() {
    Storage storage(installation.folder());
    storage.execute("begin");
    Query blob(storage, "insert into QVSys.QVMailQ(emBody,emState) values(hex(randomblob(512*1024)),0)");
    for (std::size_t i = 0; i < megabytes(); ++i) blob.start().run();
    storage.execute("commit");
    std::ofstream(file()) << std::string(megabytes() << 20, 'x');
  }
  std::string file() const { return (files.path() / "file").string(); }
  std::string backup(const std::string& name) const { return (files.path() / name).string(); }
  std::string database(const std::string& name) const { return (installation.folder() / (name + ".db")).string(); }

  test::TestInstallation installation;
  test::TestFolder files;
};

const Ground& ground() {
  static const Ground made;
  return made;
}

// An installation with a plan that ran for years, and its next runs.
const test::TestInstallation& longHistory() {
  static const test::TestInstallation installation;
  static const bool filled = [] {
    Storage storage(installation.folder());
    storage.execute("begin");
    storage.execute("insert into QVSys.tasks(taskName,taskType) values('nightly',2)");
    storage.execute(
        "with recursive n(i) as (select 1 union all select i+1 from n where i<1000000) "
        "insert into QVSys.QVTaskSche(taskId,schNo,pTime,state) select 1,i,13000000000000+i*18000,i<999000 from n");
    storage.execute("commit");
    return true;
  }();
  static_cast<void>(filled);
  return installation;
}

void requireStorage(int code) {
  if (code != SQLITE_OK && code != SQLITE_DONE) throw std::runtime_error(sqlite3_errstr(code));
}

// One file over the other by SQLite's C interface.
void copyDatabase(const std::string& from, const std::string& to) {
  sqlite3* source = nullptr;
  sqlite3* target = nullptr;
  requireStorage(sqlite3_open(from.c_str(), &source));
  requireStorage(sqlite3_open(to.c_str(), &target));
  sqlite3_backup* const copy = sqlite3_backup_init(target, "main", source, "main");
  requireStorage(sqlite3_backup_step(copy, -1));
  requireStorage(sqlite3_backup_finish(copy));
  sqlite3_close(target);
  sqlite3_close(source);
}

void copyPlainly(const std::string& from, const std::string& to) {
  fs::copy_file(from, to, fs::copy_options::overwrite_existing);
  const int file = ::open(to.c_str(), O_RDONLY | O_CLOEXEC);
  ::fsync(file);
  ::close(file);
}

using Copy = void (*)(const std::string& from, const std::string& to);

Call backUp() {
  auto manager = std::make_shared<DBMgr>();
  return {[manager] {
    require(manager->BackUpDB(ground().installation.server(), ground().backup("sys.bak"), ground().backup("app.bak")),
            *manager);
  }};
}

Side backUpFloor(Copy copy) {
  return [copy]() -> Call {
    return {[copy] {
      for (const char* name : {"QVSys", "QVApp"})
        copy(ground().database(name), ground().backup(std::string(name) + ".floor"));
    }};
  };
}

Call restore() {
  backUp().run();
  auto manager = std::make_shared<DBMgr>();
  return {[manager] {
    require(manager->RestoreDB(ground().installation.server(), ground().backup("sys.bak"), ground().backup("app.bak"),
                               "test-admin"),
            *manager);
  }};
}

Side restoreFloor(Copy copy, const std::string& ending) {
  return [copy, ending]() -> Call {
    backUp().run();
    return {[copy, ending] {
      copy(ground().backup("sys.bak"), ground().backup("sys" + ending));
      copy(ground().backup("app.bak"), ground().backup("app" + ending));
    }};
  };
}

Call sum() {
  return {[] { cCRC32().GetFileCrc32(ground().file()); }};
}

Call sumFloor() {
  return {[] {
    std::vector<char> block(1 << 20);
    std::ifstream file(ground().file(), std::ios::binary);
    uLong running = 0;
    while (file.read(block.data(), static_cast<std::streamsize>(block.size())) || file.gcount() > 0)
      running = ::crc32_z(running, reinterpret_cast<const Bytef*>(block.data()), static_cast<z_size_t>(file.gcount()));
    if (running == 0) throw std::runtime_error("no sum");
  }};
}

std::shared_ptr<cSchedule> schedule() {
  auto made = std::make_shared<cSchedule>();
  made->connect(longHistory().server());
  made->cycle(1);
  made->wks("1000100");
  made->interval(15);
  made->valUnit(1);
  return made;
}

constexpr int computations = 1000;

Call next() {
  return {[when = schedule()] {
    for (int i = 0; i < computations; ++i) when->GetNextTime(Date(46000 + i / 7.0));
  }};
}

// As many weekdays by the C library.
Call nextFloor() {
  return {[] {
    std::time_t moment = 1'800'000'000;
    std::tm parts{};
    for (int i = 0; i < computations; ++i, moment += 12'343) {
      gmtime_r(&moment, &parts);
      parts.tm_min += 15;
      if (timegm(&parts) < moment) throw std::runtime_error("time runs backwards");
    }
  }};
}

Call due() {
  return {[when = schedule()] {
    Integer type = 0;
    Long task = 0;
    Long run = 0;
    Date moment;
    if (when->getNextSch(Date(2024, 1, 1), type, task, run, moment) < 0) throw std::runtime_error("no schedule");
  }};
}

class DueFloor {
 public:
  void run() { query_.start(std::int64_t{0}).step(); }

 private:
  Storage storage_{longHistory().folder()};
  Query query_{storage_,
               "select t.taskType,t.taskId,s.schNo,s.pTime from QVSys.QVTaskSche s join QVSys.tasks t on "
               "t.taskId=s.taskId where s.state=0 and s.pTime>=?1 order by s.pTime limit 1"};
};

Call dueFloor() {
  return {[floor = std::make_shared<DueFloor>()] { floor->run(); }};
}

}  // namespace

void addMaintenancePairs() {
  const std::string size = ", " + std::to_string(megabytes()) + " MB";
  addPair("cSchedule.GetNextTime, 1,000 times", next, nextFloor);
  addPair("cSchedule.getNextSch, 1,000,000 rows", due, dueFloor);
  addPair("cCRC32.GetFileCrc32" + size, sum, sumFloor);
  addPair("DBMgr.BackUpDB" + size, backUp, backUpFloor(copyDatabase));
  addPair("DBMgr.BackUpDB and a plain copy" + size, backUp, backUpFloor(copyPlainly));
  addPair("DBMgr.RestoreDB" + size, restore, restoreFloor(copyDatabase, ".floor"));
  addPair("DBMgr.RestoreDB and a plain copy" + size, restore, restoreFloor(copyPlainly, ".plain"));
}

}  // namespace QVSa::bench
