#include <fstream>
#include <future>
#include <gtest/gtest.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <unistd.h>

#include "providers/embedded/storage/Handle.h"
#include "tests/embedded/ChildProcess.h"
#include "tests/embedded/InstallationFolder.h"

namespace QVSa::embedded {
namespace {

using std::chrono::milliseconds;
using std::chrono::steady_clock;

constexpr std::size_t qvSys = 1;
constexpr std::size_t qvApp = 2;

Failure failureOf(const std::function<void()>& action) {
  try {
    action();
  } catch (const Failure& failure) {
    return failure;
  }
  return Failure(0, "", "nothing failed");
}

std::int64_t count(Handle& handle, const std::string& from) {
  Prepared query(handle.get(), "select count(*) from " + from);
  query.step();
  return std::get<std::int64_t>(query.column(0));
}

class HandleOfAnInstallation : public testing::Test {
 protected:
  // The failure of opening, which has to say that `database` cannot be opened and why.
  void expectRefused(const std::string& database, const std::string& reason) {
    const Failure failure = failureOf([&] { Handle handle(folder_.data()); });
    EXPECT_EQ(failure.number(), number::login);
    EXPECT_EQ(failure.native(), 4060);
    const std::string file = databaseFile(folder_.data(), database).string();
    for (const std::string& told : {"Cannot open database \"" + database + "\": ", reason, file})
      EXPECT_NE(failure.description().find(told), std::string::npos) << failure.description();
  }

  void fillTable() {
    Handle handle(folder_.data());
    handle.execute("create table QVSys.t(x integer primary key, y text); insert into QVSys.t values(1,'kept')");
  }

  // Replaces bytes of a database file that nobody has open.
  void overwrite(const std::string& database, std::streamoff at, const std::string& bytes) {
    std::fstream file(databaseFile(folder_.data(), database), std::ios::in | std::ios::out | std::ios::binary);
    file.seekp(at);
    file << bytes;
  }

  InstallationFolder folder_;
};

TEST_F(HandleOfAnInstallation, EveryDatabaseIsThereUnderItsName) {
  Handle handle(folder_.data());
  for (const char* name : databaseNames) EXPECT_EQ(count(handle, std::string(name) + ".engine"), 1) << name;
  Prepared mode(handle.get(),
                "select (select journal_mode from pragma_journal_mode('QVApp')), synchronous from "
                "pragma_synchronous('QVApp')");
  ASSERT_TRUE(mode.step());
  EXPECT_EQ(std::get<std::string>(mode.column(0)), "wal");
  EXPECT_EQ(std::get<std::int64_t>(mode.column(1)), 2);
}

TEST_F(HandleOfAnInstallation, AMissingFolderIsAMissingServer) {
  const Failure failure = failureOf([&] { Handle handle(folder_.root() / "elsewhere"); });
  EXPECT_EQ(failure.number(), number::general);
  EXPECT_EQ(failure.native(), 17);
  EXPECT_FALSE(std::filesystem::exists(folder_.root() / "elsewhere"));
  EXPECT_NE(failure.description().find((folder_.root() / "elsewhere").string()), std::string::npos);
  EXPECT_EQ(failureOf([&] { Handle handle(folder_.root()); }).native(), 17);
  std::filesystem::remove(databaseFile(folder_.data(), "master"));
  expectRefused("master", "the file is missing");
}

TEST_F(HandleOfAnInstallation, AFileThatIsNotOursIsRefusedAndLeftAlone) {
  const auto file = databaseFile(folder_.data(), "QVSys");
  std::filesystem::remove(file);
  expectRefused("QVSys", "the file is missing");
  EXPECT_FALSE(std::filesystem::exists(file));

  std::ofstream(file) << std::string(5000, 'x');
  expectRefused("QVSys", "no database");
  std::ofstream(file, std::ios::trunc).close();
  expectRefused("QVSys", "no database of this system");
  EXPECT_EQ(std::filesystem::file_size(file), 0U);

  std::filesystem::remove(file);
  sqlite3* other = nullptr;
  sqlite3_open(file.c_str(), &other);
  sqlite3_exec(other, "create table engine(layout)", nullptr, nullptr, nullptr);
  sqlite3_close(other);
  expectRefused("QVSys", "no database of this system");

  std::filesystem::copy_file(databaseFile(folder_.data(), "QVApp"), file,
                             std::filesystem::copy_options::overwrite_existing);
  expectRefused("QVSys", "the file is the one of QVApp");
}

TEST_F(HandleOfAnInstallation, ALayoutThatIsNotKnownIsRefused) {
  Handle handle(folder_.data());
  handle.execute("update QVApp.engine set layout=0");
  expectRefused("QVApp", "a layout that no release has written");
  handle.execute("update QVApp.engine set layout=" + std::to_string(layoutVersion + 1));
  expectRefused("QVApp", "A newer release has to open it.");
  EXPECT_EQ(failureOf([&] { handle.catalogueVersion(); }).native(), 4060) << "it came while the handle was open";
}

TEST_F(HandleOfAnInstallation, AFullDiskIsToldAsWhatItIs) {
  EXPECT_EQ(ChildProcess([&] {
              ::signal(SIGXFSZ, SIG_IGN);
              const rlimit limit{1000, 1000};
              ::setrlimit(RLIMIT_FSIZE, &limit);
              const Failure failure = failureOf([&] { Handle handle(folder_.data()); });
              return failure.native() == 4060 && failure.description().find("no room") != std::string::npos ? 0 : 1;
            }).exitCode(),
            0);
}

TEST_F(HandleOfAnInstallation, ADamagedFileIsRefused) {
  fillTable();
  std::filesystem::resize_file(databaseFile(folder_.data(), "QVSys"), 4096 + 100);
  expectRefused("QVSys", "damaged");
}

TEST_F(HandleOfAnInstallation, DamageFoundLaterIsAFailureToo) {
  fillTable();
  const auto size = static_cast<std::streamoff>(std::filesystem::file_size(databaseFile(folder_.data(), "QVSys")));
  overwrite("QVSys", size - 4096, std::string(4096, '\xEE'));
  Handle handle(folder_.data());
  EXPECT_EQ(failureOf([&] { count(handle, "QVSys.t where y='kept'"); }).native(), 824);
}

TEST_F(HandleOfAnInstallation, AnotherUserWithoutRightsGetsAClearFailureAndTheDataStays) {
  if (::geteuid() != 0) GTEST_SKIP() << "takes another user's identity";
  fillTable();
  const auto refusedAsNobody = [&] {
    return ChildProcess([&] {
             constexpr uid_t nobody = 65534;
             if (::setgid(nobody) != 0 || ::setuid(nobody) != 0) return 98;
             return failureOf([&] { Handle handle(folder_.data()); }).native() == 4060 ? 0 : 1;
           })
        .exitCode();
  };
  ASSERT_EQ(::chmod(folder_.root().c_str(), 0755), 0);
  EXPECT_EQ(refusedAsNobody(), 0) << "no access to the folder";
  ASSERT_EQ(::chmod(folder_.data().c_str(), 0755), 0);
  EXPECT_EQ(refusedAsNobody(), 0) << "no access to the files";
  for (const char* name : databaseNames) ::chmod(databaseFile(folder_.data(), name).c_str(), 0644);
  EXPECT_EQ(refusedAsNobody(), 0) << "files that can only be read";
  for (const char* name : databaseNames) ::chmod(databaseFile(folder_.data(), name).c_str(), 0666);
  EXPECT_EQ(refusedAsNobody(), 0) << "a folder that cannot be written";
  Handle handle(folder_.data());
  EXPECT_EQ(count(handle, "QVSys.t where y='kept'"), 1);
}

TEST_F(HandleOfAnInstallation, BrokenRulesOfATableHaveSqlServersNumbers) {
  Handle handle(folder_.data());
  handle.execute(
      "create table QVSys.u(id integer primary key, login text collate tsql not null unique, no text collate tsql);"
      "create unique index QVSys.\"u.byNo\" on u(no); insert into QVSys.u values(1,'Ann','A1')");
  const auto failing = [&](const std::string& values) {
    return failureOf([&] { handle.execute("insert into QVSys.u values(" + values + ")"); });
  };
  EXPECT_EQ(failing("1,'Bob','B'").native(), 2627);
  EXPECT_EQ(failing("2,'ANN ','B'").description(),
            "Violation of UNIQUE KEY constraint. Cannot insert duplicate key in object 'u'. (column u.login)");
  EXPECT_EQ(failing("2,'Bob','a1'").description(),
            "Cannot insert duplicate key row in object 'u' with unique index 'byNo'.");
  EXPECT_EQ(failing("2,null,'C'").description(),
            "Cannot insert the value NULL into column 'login', table 'u'; column does not allow nulls.");
  EXPECT_EQ(failing("2,null,'C'").number(), number::integrity);
}

TEST_F(HandleOfAnInstallation, AWriteOverOldRowsIsADeadlock) {
  Handle first(folder_.data()), second(folder_.data());
  first.execute("begin");
  count(first, "QVSys.engine");
  second.execute("update QVSys.engine set catalogue=catalogue+1");
  const Failure failure = failureOf([&] { first.takeWriter(qvSys); });
  EXPECT_EQ(failure.native(), 1205);
  EXPECT_EQ(failure.number(), number::general);
}

}  // namespace
}  // namespace QVSa::embedded
