#include <filesystem>
#include <fstream>

#include "QVSa/frame/Secrets.h"
#include "QVSa/maintenance/internal/BackupLock.h"
#include "QVSa/values/Text.h"
#include "platform/Files.h"
#include "platform/SecretMessage.h"
#include "providers/embedded/storage/Pool.h"
#include "tests/support/FakeSession.h"
#include "tests/support/RecordingProvider.h"
#include "tests/support/Scene.h"

namespace QVSa::test {
namespace {

class Backups : public FilesScene {
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
  EXPECT_EQ(refusal(manager_, manager_.BackUpDB(server(), file("no\\sys.bak"), file("app.bak"))), messageNumber(2906));
  EXPECT_EQ(manager_.errDescription().rfind("Database backup error.Cannot open backup device", 0), 0U);
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
  EXPECT_EQ(refusal(manager_, manager_.decryptTmps(server(), "Lock")), messageNumber(2909));
  EXPECT_EQ(manager_.errDescription(), "Incorrect password.");
  EXPECT_EQ(spec(), locked);
  EXPECT_TRUE(manager_.decryptTmps(server(), "lock"));
  EXPECT_EQ(spec(), "");
  EXPECT_TRUE(manager_.decryptTmps(server(), "anything"));

  tables_.run("update roles set roleSpec=N'" + platform::encryptText("7.9", deploymentSecrets().backupLockKey()) +
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

TEST_F(Backups, OfADatabaseWithOneFileAreRefused) {
  backUp();
  FakeServer server;
  server.answer("select name, fileName from sysfiles", {{{"name"}, {"fileName"}}, {{"QVSys", "QVSys.db"}}});
  EXPECT_FALSE(restore("host"));
  EXPECT_EQ(manager_.errNumber(), messageNumber(2907));
  EXPECT_EQ(manager_.errDescription(), "The backup fies has error, can not be restored.");
  EXPECT_EQ(server.log[server.log.size() - 2], "alter database QVSys set MULTI_USER");
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
    EXPECT_EQ(refusal(user, user.GetOne(3, "ann")), number::login);
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
