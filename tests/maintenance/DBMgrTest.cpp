#include <filesystem>
#include <fstream>

#include "QVSa/frame/DeploymentSecrets.h"
#include "QVSa/frame/internal/Providers.h"
#include "QVSa/maintenance/internal/BackupLock.h"
#include "QVSa/maintenance/internal/RotatedKey.h"
#include "QVSa/values/Text.h"
#include "platform/Files.h"
#include "platform/SecretMessage.h"
#include "providers/embedded/session/Provider.h"
#include "providers/embedded/storage/Pool.h"
#include "tests/support/RecordingProvider.h"
#include "tests/support/Scene.h"

namespace QVSa::test {
namespace {

class Backups : public Scene {
 protected:
  static constexpr const char* password = TestInstallation::administratorPassword;

  String file(const String& name) const { return folder_.path().string() + "\\" + name; }
  void backUp(const String& lock = "") {
    ASSERT_TRUE(manager_.BackUpDB(server(), file("sys.bak"), file("app.bak"), "", lock)) << manager_.errDescription();
  }
  Boolean restore() { return restore(server()); }
  Boolean restore(const String& where) { return manager_.RestoreDB(where, file("sys.bak"), file("app.bak"), password); }
  void damage(const String& name) const {
    Bytes content = platform::readFile(file(name));
    std::fill_n(content.begin() + std::ptrdiff_t{5} * 4096, 4000, std::uint8_t{0x5A});
    platform::writeFile(file(name), content);
  }
  void addReports() { tables_.run("insert into reports(repId,repName) select 3,'a' union all select 5,'b'"); }
  String spec() const { return tables_.text("select roleSpec from roles where roleId=4"); }

  TestFolder folder_;
  DBMgr manager_;
};

TEST_F(Backups, BringBackWhatWasThereAndClearWhatWasTransient) {
  addUser("ann");
  tables_.run("insert into idRule(idName,ymdStyle,noStyle) values('inv',0,4)");
  tables_.run("insert into seslog(sesId,userLogin) values('1','ann')");
  tables_.run("insert into repTmps(rtUid,ifCheckOut,checkOutBy) values('t',1,7)");
  tables_.run(
      "insert into CFWorkItems(wiId,state,checkOutBy,checkOutByName) select 'w',1,7,'ann' union all "
      "select 'v',2,8,'bob'");
  backUp();
  addUser("bob");
  tables_.run("delete from idRule where idName='inv'");
  ASSERT_TRUE(restore()) << manager_.errDescription();

  EXPECT_EQ(tables_.text("select userLogin from users where userId>1"), "ann");
  EXPECT_EQ(tables_.text("select idName from idRule where predefined=0"), "inv");
  EXPECT_EQ(tables_.text("select count(*) from seslog"), "0");
  EXPECT_EQ(tables_.text("select ifCheckOut,checkOutBy from repTmps"), "0|-");
  EXPECT_EQ(tables_.text("select wiId,state,checkOutBy,checkOutByName from CFWorkItems order by wiId"),
            "v|2|8|bob\nw|0|0|");
  auto ann = connected<User>();
  EXPECT_TRUE(ann.loginAuth("ann", "right")) << ann.errDescription();
}

TEST_F(Backups, OfOneInstallationRestoreIntoAnother) {
  addUser("ann");
  backUp();
  const TestInstallation other;
  ASSERT_TRUE(restore(other.server())) << manager_.errDescription();
  User ann;
  ann.connect(other.server(), "QVApp");
  String session;
  EXPECT_TRUE(ann.loginAuth("ann", "right", &session)) << ann.errDescription();
  EXPECT_EQ(PlainSession(other.server()).text("select userLogin from seslog"), "ann");
}

TEST_F(Backups, AreRefusedWhereAFileIsMissing) {
  EXPECT_FALSE(restore());
  EXPECT_EQ(manager_.errNumber(), messageNumber(2903));
  EXPECT_EQ(manager_.errDescription(),
            "Database restoring error.Application database backup file [" + file("app.bak") + "] does not exist.");
  backUp();
  std::filesystem::remove(folder_.path() / "sys.bak");
  EXPECT_FALSE(restore());
  EXPECT_EQ(manager_.errNumber(), messageNumber(2904));
}

TEST_F(Backups, NeedTheAdministratorToRestore) {
  backUp();
  EXPECT_FALSE(manager_.RestoreDB(server(), file("sys.bak"), file("app.bak"), "wrong"));
  EXPECT_EQ(manager_.errNumber(), number::login);
  EXPECT_EQ(manager_.errDescription(), "Login failed for user 'sa'.:18456");
  EXPECT_FALSE(manager_.RestoreDB(server(), file("sys.bak"), file("app.bak"), defaultDbPwd(), false, "QVUser"));
  EXPECT_EQ(manager_.errDescription(), "User does not have permission to RESTORE database 'QVSys'.:3110");
  EXPECT_EQ(tables_.text("select count(*) from users"), "1") << "and the database is back for all";
}

TEST_F(Backups, SendTheirStatementsInOrder) {
  std::vector<String> log;
  {
    RecordingProvider recorder;
    backUp("lock");
    log = recorder.log();
  }
  const String sys = file("sys.bak"), app = file("app.bak");
  EXPECT_EQ(
      log,
      (Lines{"open master", "use QVSys", "select isnull(roleSpec) from roles where roleId=4",
             "select repId from reports", "use master", " backup database QVApp to DISK = '" + app + "' with init",
             " backup database QVSys to DISK = '" + sys + "' with init", "restore verifyonly from disk='" + sys + "'",
             "restore verifyonly from disk='" + app + "'", "select repId from reports", "close"}));
  {
    RecordingProvider recorder;
    ASSERT_TRUE(restore());
    log = recorder.log();
  }
  const auto restoring = [&](const String& database, const String& backup) {
    const String data = (installation_.folder() / (database + ".db")).string();
    return Lines{"open master",
                 "alter database " + database + " set SINGLE_USER",
                 "use " + database,
                 "select name, fileName from sysfiles",
                 "use master",
                 "RESTORE DATABASE " + database + " FROM DISK = N'" + backup + "' With  move N'" + database +
                     "' to N'" + data + "', move N'" + database + "_log' to N'" + data + "-wal',replace",
                 "alter database " + database + " set MULTI_USER",
                 "use " + database,
                 "sp_changedbowner N'QVUser'",
                 "close"};
  };
  Lines expected = restoring("QVSys", sys);
  for (const Lines& more :
       {Lines{"open QVSys", "select isnull(release,'6.5') from sysinfo", "close"}, restoring("QVApp", app),
        Lines{"open QVSys", "delete from sesLog",
              "update reptmps set ifCheckout=0,checkOutBy=null Where ifCheckOut = 1",
              "update CFWorkItems set state=0,checkOutBy=0,checkOutByName='' where state=1", "close"}})
    expected.insert(expected.end(), more.begin(), more.end());
  EXPECT_EQ(log, expected);
}

TEST_F(Backups, LockTheCopyAndTheRunningSystem) {
  backUp("lock");
  EXPECT_EQ(spec(), "-") << "without reports there is nothing to lock";
  addReports();
  backUp("lock");
  const auto lock = [&] {
    const auto found = BackupLock::read(spec());
    return found ? found->list + "|" + found->pwd : "none";
  };
  EXPECT_EQ(lock(), "3.5|lock") << "the lock stays on the running system";
  const String locked = spec();
  backUp();
  EXPECT_EQ(spec(), locked) << "without a password nobody touches it";
  EXPECT_FALSE(manager_.BackUpDB(server(), file("no\\sys.bak"), file("app.bak"), "", "other"));
  EXPECT_EQ(lock(), "3.5|other") << "it stays after a failure, too";

  ASSERT_TRUE(restore());
  QVAgent agent;
  agent.connect(server());
  EXPECT_EQ(agent.hiddenReps(), "3.5");
  EXPECT_FALSE(manager_.decryptTmps(server(), "Lock"));
  EXPECT_EQ(manager_.errNumber(), messageNumber(2909));
  EXPECT_EQ(manager_.errDescription(), "Incorrect password.");
  EXPECT_EQ(spec(), locked);
  EXPECT_TRUE(manager_.decryptTmps(server(), "lock"));
  EXPECT_EQ(spec(), "");
  EXPECT_TRUE(manager_.decryptTmps(server(), "anything"));

  tables_.run("update roles set roleSpec=N'" + platform::encryptText("7.9", rotatedKey(secrets::backupLockKeyStart)) +
              "' where roleId=4");
  agent.connect(server());
  EXPECT_EQ(agent.hiddenReps(), "7.9") << "without a bar all of it is the list";
  EXPECT_FALSE(manager_.decryptTmps(server(), "lock"));
  EXPECT_TRUE(manager_.decryptTmps(server(), "")) << "and the password is empty";
}

TEST_F(Backups, OfAnOlderReleaseGetTheTableOfRoles) {
  const auto makeOld = [&](const String& release) {
    tables_.run("delete from QVSys..sysinfo");
    if (!release.empty()) tables_.run("insert into QVSys..sysinfo(release) values('" + release + "')");
  };
  addUser("ann", [](User&) {});
  tables_.run("update users set isRole=1,isAbstract=1,userDesc='a role',userPwd='spec' where userLogin='ann'");
  PlainSession(server(), "QVSys").run("drop table roles");
  makeOld("");
  tables_.run("insert into seslog(sesId,userLogin) values('1','ann')");
  backUp();
  // A copy that fails behind the system's: that one is restored and upgraded, the rest is as it was.
  tables_.run("insert into idRule(idName,ymdStyle,noStyle) values('inv',0,4)");
  const Bytes whole = platform::readFile(file("app.bak"));
  damage("app.bak");
  EXPECT_FALSE(restore());
  EXPECT_EQ(manager_.errDescription().substr(manager_.errDescription().size() - 5), ":3241");
  EXPECT_EQ(tables_.text("select count(*) from roles"), "1");
  EXPECT_EQ(tables_.text("select idName from idRule where predefined=0"), "inv");
  EXPECT_EQ(tables_.text("select count(*) from seslog"), "1");
  platform::writeFile(file("app.bak"), whole);
  ASSERT_TRUE(restore()) << manager_.errDescription();
  EXPECT_EQ(tables_.text("select roleId,roleName,roleDesc,roleSpec,builtIn from roles"),
            tables_.text("select userId from users where userLogin='ann'") + "|Ann|a role|spec|1");
  for (const char* release : {"6.6.5", "7.0", "", "8"}) {
    makeOld(release[0] == 0 ? " " : release);
    backUp();
    EXPECT_TRUE(restore()) << release << ": " << manager_.errDescription();
  }
  makeOld("6.6.4");
  backUp();
  EXPECT_FALSE(restore()) << "the table is there already";
  EXPECT_EQ(manager_.errDescription().rfind("Database restoring error.There is already an object named", 0), 0U)
      << manager_.errDescription();
}

// A database whose log is kept from the reader.
class OneFileSession : public ProviderSession {
 public:
  explicit OneFileSession(const ConnectionOptions& options) : inner_(embedded::provider().open(options)) {}
  BatchResult run(const Batch& batch) override {
    return inner_->run({replaceAll(batch.text, "select name", "select top 1 name"), batch.updatable, batch.timeout});
  }
  void begin() override { inner_->begin(); }
  void commit() override { inner_->commit(); }
  void rollback() override { inner_->rollback(); }

 private:
  std::unique_ptr<ProviderSession> inner_;
};

TEST_F(Backups, OfADatabaseWithOneFileAreRefused) {
  backUp();
  SessionOpener before =
      interposeOpener([](const ConnectionOptions& options) { return std::make_unique<OneFileSession>(options); });
  EXPECT_FALSE(restore());
  interposeOpener(std::move(before));
  EXPECT_EQ(manager_.errNumber(), messageNumber(2907));
  EXPECT_EQ(manager_.errDescription(), "The backup fies has error, can not be restored.");
  EXPECT_TRUE(restore()) << "the database is in multi-user mode again: " << manager_.errDescription();
}

TEST_F(Backups, LeaveTheDatabaseToAllWhereARestoreFails) {
  backUp();
  for (const char* statement : {"use QVSys", "RESTORE DATABASE QVSys"}) {
    RecordingProvider recorder;
    recorder.beforeEach([&](const String& event) {
      if (event.rfind(statement, 0) == 0) throw Failure(number::statement, "SQL Server", "Made up.", 911);
    });
    EXPECT_FALSE(restore());
    EXPECT_EQ(manager_.errDescription(), "Made up.:911");
    EXPECT_EQ(recorder.log().at(recorder.log().size() - 2), "alter database QVSys set MULTI_USER");
  }
}

TEST_F(Backups, DamagedOrForeignAreRefused) {
  backUp();
  addUser("ann");
  damage("sys.bak");
  EXPECT_FALSE(restore());
  EXPECT_EQ(manager_.errDescription().substr(manager_.errDescription().size() - 5), ":3241");
  platform::writeFile(file("sys.bak"), {});
  EXPECT_FALSE(restore());
  EXPECT_EQ(manager_.errNumber(), number::statement);
  EXPECT_EQ(tables_.text("select userLogin from users where userId>1"), "ann") << "nothing was touched";
  EXPECT_FALSE(manager_.BackUpDB(server(), file("no\\sys.bak"), file("app.bak")));
  EXPECT_EQ(manager_.errNumber(), messageNumber(2906));
  EXPECT_EQ(manager_.errDescription().rfind("Database backup error.Cannot open backup device", 0), 0U);
}

// A host that is not the administrator's hears which file it is; the administrator gets his backup in.
TEST_F(Backups, ComeBackWhereADatabaseCannotBeRead) {
  addUser("ann");
  backUp();
  const std::filesystem::path& folder = installation_.folder();
  const auto sysFile = embedded::databaseFile(folder, "QVSys");
  const std::vector<std::function<void()>> damages{
      [&] { std::ofstream(sysFile) << String(9000, 'x'); },
      [&] { std::filesystem::remove(sysFile); },
      [&] {
        std::filesystem::copy_file(embedded::databaseFile(folder, "QVApp"), sysFile,
                                   std::filesystem::copy_options::overwrite_existing);
      },
      [&] { embedded::Handle(folder).execute("update QVSys.definitions set text='create tabel' where name='users'"); },
      [&] { embedded::Handle(folder).execute("update QVSys.engine set layout=99; update QVApp.engine set layout=99"); },
  };
  for (const auto& damage : damages) {
    embedded::discardIdleHandle(folder);
    damage();
    User user;
    user.connect(server());
    EXPECT_FALSE(user.GetOne(3, "ann"));
    EXPECT_EQ(user.errNumber(), number::login);
    EXPECT_NE(user.errDescription().find(sysFile.string()), String::npos) << user.errDescription();
    EXPECT_FALSE(manager_.BackUpDB(server(), file("other.bak"), file("other2.bak")));
    EXPECT_FALSE(manager_.RestoreDB(server(), file("sys.bak"), file("app.bak"), "wrong"));
    EXPECT_EQ(manager_.errDescription(), "Login failed for user 'sa'.:18456");
    ASSERT_TRUE(restore()) << manager_.errDescription();
    EXPECT_EQ(loaded("ann").Name(), "Ann");
  }
  // What is no longer read is kept, but for what was missing and what was overwritten in place.
  const auto isKept = [](const auto& entry) { return entry.path().string().find(".replaced-") != String::npos; };
  EXPECT_GE(std::ranges::count_if(std::filesystem::directory_iterator(folder), isKept), 1);
}

}  // namespace
}  // namespace QVSa::test
