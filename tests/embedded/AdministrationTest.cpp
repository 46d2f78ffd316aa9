#include <fcntl.h>
#include <filesystem>
#include <fstream>
#include <gtest/gtest.h>
#include <optional>
#include <random>
#include <sys/stat.h>
#include <thread>
#include <unistd.h>

#include "QVSa/frame/ConnectionString.h"
#include "platform/Files.h"
#include "platform/Services.h"
#include "providers/embedded/session/Provider.h"
#include "providers/embedded/storage/CatalogueMark.h"
#include "providers/embedded/storage/Layout.h"
#include "providers/embedded/storage/Pool.h"
#include "tests/support/Failures.h"
#include "tests/support/TestInstallation.h"

namespace QVSa::test {

namespace {

class Administration : public testing::Test {
 protected:
  std::unique_ptr<ProviderSession> open(const std::string& database) {
    return embedded::provider().open(parseConnectionString(buildConnString(installation_.server(), database, false)));
  }
  std::unique_ptr<ProviderSession> administrator() {
    return embedded::provider().open(parseConnectionString(installation_.administratorString("master")));
  }
  static Long native(ProviderSession& session, const std::string& text, int seconds = 1) {
    return thrownBy([&] { session.run({text, false, std::chrono::seconds(seconds)}); }).native();
  }
  static Variant value(ProviderSession& session, const std::string& text) {
    const auto result = session.run({text});
    return result.rows->next() ? result.rows->value(0) : Variant();
  }
  std::string file(const std::string& name) const { return (folder_.path() / name).string(); }
  std::string restoring(const std::string& database, const std::string& name) const {
    return "restore database " + database + " from disk=N'" + file(name) + "' with replace";
  }

  TestInstallation installation_{TestInstallation::Content::empty};
  TestFolder folder_;
};

const std::string alone = "alter database QVSys set single_user";
const std::string shared = "alter database QVSys set multi_user";

}  // namespace

TEST_F(Administration, SingleUserModeWaitsForTheSessionsOfTheDatabase) {
  auto session = administrator();
  auto user = open("QVSys");
  EXPECT_EQ(native(*session, alone + " with no_wait"), 5061);
  EXPECT_EQ(failureOf([&] { session->run({alone, false, std::chrono::seconds(1)}); }), number::timeout);
  std::thread leaving([&] {
    std::this_thread::sleep_for(std::chrono::milliseconds(50));
    user.reset();
  });
  EXPECT_EQ(native(*session, alone, 0), 0) << "one kept warm in the pool holds nothing";
  leaving.join();
}

TEST_F(Administration, SingleUserModeKeepsAllOthersOut) {
  auto session = administrator();
  auto elsewhere = open("QVApp");
  session->run({"create table QVSys..t (n int null)"});
  session->run({alone});
  EXPECT_EQ(failureOf([&] { open("QVSys"); }), number::login);
  EXPECT_EQ(native(*elsewhere, "use QVSys"), 924);
  EXPECT_EQ(native(*elsewhere, "select * from QVSys..t"), 924);
  EXPECT_EQ(native(*elsewhere, "insert into QVSys..t(n) values(1)"), 924);
  EXPECT_EQ(native(*elsewhere, shared), 924);
  EXPECT_EQ(native(*session, "use QVSys"), 0);
  EXPECT_EQ(native(*session, "select * from t"), 0);
  session->run({shared});
  EXPECT_EQ(native(*elsewhere, "select * from QVSys..t"), 0);
  session->run({"use master"});
  session->run({alone});
  session.reset();
  EXPECT_EQ(native(*elsewhere, "use QVSys"), 0) << "the mode ends with its session";
}

TEST_F(Administration, AStatementElsewhereStandsAgainstItUntilItIsDone) {
  auto session = administrator();
  auto elsewhere = open("QVApp");
  session->run({"create table QVSys..t (n int null)"});
  session->run({"insert into QVSys..t(n) values(1)"});
  session->run({"insert into QVSys..t(n) values(2)"});
  {
    const auto rows = elsewhere->run({"select n from QVSys..t"});
    ASSERT_TRUE(rows.rows->next());
    EXPECT_EQ(native(*session, alone + " with no_wait"), 5061) << "the row set is still open";
  }
  EXPECT_EQ(native(*session, alone + " with no_wait"), 0);
  session->run({shared});
  elsewhere->begin();
  elsewhere->run({"update QVSys..t set n=3"});
  EXPECT_EQ(native(*session, alone + " with no_wait"), 5061) << "so is the transaction";
  elsewhere->rollback();
  EXPECT_EQ(native(*session, alone + " with no_wait"), 0);
}

TEST_F(Administration, ARestoreBringsTheCopyBackAndEverySessionSeesIt) {
  auto session = administrator();
  session->run({"create table QVSys..t (n int not null primary key)"});
  session->run({"insert into QVSys..t(n) values(1)"});
  session->run({"backup database QVSys to disk='" + file("a") + "' with init"});
  auto warm = open("QVApp");
  EXPECT_EQ(value(*warm, "select count(*) from QVSys..t").toLong(), 1);
  // As many definitions as the copy has, and other ones: the count alone does not tell them apart.
  session->run({"drop table QVSys..t"});
  session->run({"create table QVSys..t (name nvarchar(9) null)"});
  EXPECT_TRUE(value(*warm, "select max(name) from QVSys..t").isNull());
  warm.reset();
  session->run({restoring("QVSys", "a")});
  warm = open("QVApp");
  EXPECT_EQ(value(*warm, "select max(n) from QVSys..t").toLong(), 1);
  EXPECT_EQ(native(*warm, "select name from QVSys..t"), 207);
  EXPECT_EQ(native(*warm, "insert into QVSys..t(n) values(1)"), 2627);
}

// The second time under a mark that somebody left behind who died in the middle of a definition.
TEST_F(Administration, AWarmHandleKnowsWhatHasChangedSinceItsLastSession) {
  auto session = administrator();
  session->run({"create view QVSys..v as select 0 as a"});
  const embedded::CatalogueMark mark(embedded::lockFile(installation_.folder(), "master"));
  std::optional<embedded::CatalogueChange> unfinished;
  for (Long now : {1, 2}) {
    EXPECT_EQ(value(*open("QVSys"), "select a from v").toLong(), now - 1);
    EXPECT_EQ(embedded::CatalogueMark::isSettled(mark.value()), !unfinished);
    session->run({"drop view QVSys..v"});
    session->run({"create view QVSys..v as select " + std::to_string(now) + " as a"});
    EXPECT_EQ(value(*open("QVSys"), "select a from v").toLong(), now);
    unfinished.emplace(mark);
  }
  unfinished.reset();
  {
    auto undone = open("QVSys");
    undone->begin();
    undone->run({"drop view v"});
  }
  EXPECT_EQ(value(*open("QVSys"), "select a from v").toLong(), 2);
  session->run({"drop login QVUser"});
  EXPECT_EQ(native(*session, "drop login QVUser"), 15151);
  EXPECT_EQ(thrownBy([&] { open("QVSys"); }).native(), 18456);
  EXPECT_EQ(native(*session, "alter login QVUser with password=N'another'"), 15151);
  session->run({"create login QVUser with password=N'another'"});
  EXPECT_EQ(thrownBy([&] { open("QVSys"); }).native(), 18456);
  session->run({"alter login qvuser with password=N'" + defaultDbPwd() + "'"});
  EXPECT_EQ(native(*open("QVSys"), "alter login sa with password=N'mine now'"), 229);
}

TEST_F(Administration, ARestoreNeedsTheDatabaseForItself) {
  auto session = administrator();
  session->run({"backup database QVSys to disk='" + file("a") + "' with init"});
  auto user = open("QVSys");
  EXPECT_EQ(native(*session, restoring("QVSys", "a")), 3101);
  EXPECT_EQ(native(*user, restoring("QVApp", "a")), 3110);
  user.reset();
  session->run({"use QVSys"});
  EXPECT_EQ(native(*session, restoring("QVSys", "a")), 3102);
  session->run({"use master"});
  EXPECT_EQ(native(*session, restoring("QVSys", "a")), 0);
  const std::string data = (installation_.folder() / "QVSys.db").string();
  const auto moving = [&](const std::string& name, const std::string& target) {
    return "restore database QVSys from disk='" + file("a") + "' with move '" + name + "' to '" + target + "', replace";
  };
  EXPECT_EQ(native(*session, moving("QVSys", data)), 0);
  EXPECT_EQ(native(*session, moving("QVSys", data + "x")), 3156);
  EXPECT_EQ(native(*session, moving("QVApp", data)), 3234);
}

TEST_F(Administration, WhatIsNoBackupIsRefused) {
  auto session = administrator();
  EXPECT_EQ(native(*session, restoring("QVSys", "none")), 3201);
  std::filesystem::create_directory(file("folder"));
  EXPECT_EQ(native(*session, restoring("QVSys", "folder")), 3241);
  sqlite3* foreign = nullptr;
  ASSERT_EQ(sqlite3_open(file("foreign").c_str(), &foreign), SQLITE_OK);
  EXPECT_EQ(
      sqlite3_exec(foreign, "create table engine(layout); insert into engine values(1)", nullptr, nullptr, nullptr),
      SQLITE_OK);
  sqlite3_close(foreign);
  EXPECT_EQ(native(*session, restoring("QVSys", "foreign")), 3241);

  session->run({"backup database QVSys to disk='" + file("odd") + "' with init"});
  EXPECT_EQ(native(*session, restoring("QVApp", "odd")), 3234) << "a copy of the other database";
  const std::string next = std::to_string(embedded::layoutVersion + 1);
  for (const auto& [layout, refused] : {std::pair{next, 3169}, {"0", 3241}, {"'x'", 3241}, {"null", 3241}}) {
    ASSERT_EQ(sqlite3_open(file("odd").c_str(), &foreign), SQLITE_OK);
    const std::string change =
        "drop table engine; create table engine(layout); insert into engine values(" + layout + ")";
    EXPECT_EQ(sqlite3_exec(foreign, change.c_str(), nullptr, nullptr, nullptr), SQLITE_OK);
    sqlite3_close(foreign);
    EXPECT_EQ(native(*session, restoring("QVSys", "odd")), refused) << layout;
  }
}

// Whatever happens to a copy's bytes, they are not taken: 1,000 single bits turned over, 200 sectors lost.
TEST_F(Administration, NoDamagedCopyIsRestored) {
  auto session = administrator();
  session->run({"create table QVSys..t (n int not null primary key, name nvarchar(50) null)"});
  session->run({"create view QVSys..v as select n from t"});
  session->run({"insert into QVSys..t values(1,N'one')"});
  session->run({"backup database QVSys to disk='" + file("whole") + "' with init"});
  const Bytes whole = platform::readFile(file("whole"));
  std::mt19937 random(20240307);
  const auto anywhere = [&](std::size_t step) {
    return std::uniform_int_distribution<std::size_t>(0, (whole.size() - 1) / step)(random) * step;
  };
  const auto expectRefused = [&](const Bytes& damaged, const std::string& what) {
    platform::writeFile(file("damaged"), damaged);
    const Long refused = native(*session, restoring("QVSys", "damaged"));
    EXPECT_TRUE(refused == 3241 || refused == 3234 || refused == 3169) << what << ": " << refused;
  };
  const auto live = [&] { return value(*session, "select max(n) from QVSys..v").toLong(); };
  session->run({"update QVSys..t set n=2"});
  for (int i = 0; i < 1000; ++i) {
    Bytes damaged = whole;
    const std::size_t place = anywhere(1);
    damaged[place] ^= static_cast<std::uint8_t>(1U << (random() % 8));
    expectRefused(damaged, "a bit at " + std::to_string(place));
  }
  constexpr std::size_t sector = 512;
  for (int lost = 0; lost < 200;) {
    Bytes damaged = whole;
    const std::size_t place = anywhere(sector);
    std::fill_n(damaged.begin() + static_cast<std::ptrdiff_t>(place), std::min(sector, whole.size() - place), 0);
    if (damaged == whole) continue;
    expectRefused(damaged, "a sector at " + std::to_string(place));
    ++lost;
  }
  expectRefused(Bytes(whole.begin(), whole.end() - 4096), "a lost page");
  Bytes longer = whole;
  longer.resize(longer.size() + 4096);
  expectRefused(longer, "a page more");
  EXPECT_EQ(live(), 2) << "nothing of all that has reached the database";
  session->run({restoring("QVSys", "whole")});
  EXPECT_EQ(live(), 1);
}

// A copy of the first release: its pages alone.
TEST_F(Administration, ACopyWithoutASumGetsAllOtherChecksAndIsTold) {
  auto session = administrator();
  session->run({"create table QVSys..t (n int not null primary key, name nvarchar(50) null)"});
  session->run({"backup database QVSys to disk='" + file("a") + "' with init"});
  Bytes pages = platform::readFile(file("a"));
  pages.resize(pages.size() / 4096 * 4096);
  std::vector<String> told;
  platform::Services services = platform::services();
  services.eventLog = [&](const String& line) { told.push_back(line); };
  const platform::Services before = platform::replaceServices(services);
  const auto restoringAfter = [&](const std::string& change) {
    platform::writeFile(file("a"), pages);
    sqlite3* copy = nullptr;
    EXPECT_EQ(sqlite3_open(file("a").c_str(), &copy), SQLITE_OK);
    embedded::FunctionContext context;
    embedded::registerFunctions(copy, context);
    EXPECT_EQ(sqlite3_exec(copy, change.c_str(), nullptr, nullptr, nullptr), SQLITE_OK) << change;
    sqlite3_close(copy);
    return native(*session, restoring("QVSys", "a"));
  };
  EXPECT_EQ(restoringAfter(""), 0);
  ASSERT_EQ(told.size(), 1U);
  EXPECT_NE(told.front().find("has no checksum"), String::npos);
  for (const char* change :
       {"update definitions set text=replace(text,'name','nane')",
        "update definitions set text=replace(text,'int','imt')", "update definitions set text='create'",
        "update definitions set name='u'", "update definitions set text=x'00'", "delete from definitions",
        "alter table t rename to u", "pragma page_size=8192; vacuum"})
    EXPECT_EQ(restoringAfter(change), 3241) << change;
  EXPECT_EQ(told.size(), 1U);
  platform::replaceServices(before);
}

TEST_F(Administration, ABackupTakesTheOldFilesPlaceOnlyWhenItIsWhole) {
  auto session = open("master");
  const auto backingUp = [](const std::string& path) {
    return "backup database QVSys to disk='" + path + "' with init";
  };
  const std::string backup = backingUp(file("a"));
  // What a killed one left is taken over, but not from one that is at it.
  for (const char* left : {"a.new", "a.new-journal"}) std::ofstream(file(left)) << "left";
  const int other = ::open(file("a.new").c_str(), O_RDWR | O_CLOEXEC);
  struct flock whole {};
  whole.l_type = F_WRLCK;
  EXPECT_EQ(::fcntl(other, F_OFD_SETLK, &whole), 0);
  EXPECT_EQ(native(*session, backup), 3201);
  ::close(other);
  session->run({backup});
  session->run({"restore verifyonly from disk='" + file("a") + "'"});
  session->run({"create table QVSys..t (n int null)"});
  session->run({backup});
  EXPECT_EQ(std::distance(std::filesystem::directory_iterator(folder_.path()), {}), 1) << "nothing is left beside it";
  std::filesystem::create_directories(file("taken") + "/inside");
  EXPECT_EQ(native(*session, backingUp(file("taken"))), 3201);
  session->run({backingUp(file(std::string(255, 'n')))});
  EXPECT_EQ(std::distance(std::filesystem::directory_iterator(folder_.path()), {}), 3) << "a failed one is gone";
  for (const char* own : {"QVSys.db", "QVApp.db-wal", "master.db-journal", "QVSys.lock"})
    EXPECT_EQ(native(*session, backingUp((installation_.folder() / own).string())), 3201) << own;
  EXPECT_EQ(native(*session, "insert into QVSys..t(n) values(1)"), 0);
}

}  // namespace QVSa::test
