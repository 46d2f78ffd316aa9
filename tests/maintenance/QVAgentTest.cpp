#include <filesystem>

#include "QVSa/maintenance/internal/BackupLock.h"
#include "platform/Files.h"
#include "platform/SecretMessage.h"
#include "tests/support/Failures.h"
#include "tests/support/Scene.h"

namespace QVSa::test {
namespace {

// A program folder with files in it, and an update database that knows what should be there.
class AgentInformation : public Scene {
 protected:
  AgentInformation() {
    replace(&platform::Services::programFolder, {[this] { return program_.path().string(); }});
  }

  String local(const String& name) const { return program_.path().string() + "/" + name; }
  void put(const String& name, const String& content) {
    platform::writeFile(local(name), Bytes(content.begin(), content.end()));
  }
  void ship(const String& name, const String& checksum) {
    updates_.run("insert into sysfile(fileName,tmpdel) values('" + name + "','" +
                 platform::encryptText(checksum, "#4172-Rxt908|") + "')");
  }
  String updateProgram() const {
    if (!std::filesystem::exists(local("QVupdate.exe"))) return "none";
    const Bytes content = platform::readFile(local("QVupdate.exe"));
    return String(content.begin(), content.end());
  }
  Integer newFiles(QVAgent& agent) {
    agent.connect(server());
    return agent.newFiles();
  }
  Integer newFiles() {
    QVAgent agent;
    return newFiles(agent);
  }

  TestFolder program_;
  PlainSession updates_{installation_.server(), "QVUpdate"};
};

// The checksum of "a" is E8B7BE43, that of "ab" 9E83486D, that of "plumless" 4DDB0C25.
TEST_F(AgentInformation, SaysWhetherTheProgramsFilesAreCurrent) {
  EXPECT_EQ(newFiles(), 0) << "no file is shipped";
  put("QVSa.dll", "a");
  ship("QVSa.dll", "E8B7BE43");
  ship("Other.dll", "1");
  EXPECT_EQ(newFiles(), 0) << "only the seven files count";
  for (const char* name : {"QVData.dll", "QVCompiler.dll", "QVSvr.dll", "QVClient.dll", "QVAdmin.exe", "QVIMC.exe"}) {
    ship(name, "9E83486D");
    EXPECT_EQ(newFiles(), 1) << name << " is missing";
    put(name, "ab");
    EXPECT_EQ(newFiles(), 0) << name;
  }
  put("QVIMC.exe", "b");
  EXPECT_EQ(newFiles(), 1) << "it differs";
}

TEST_F(AgentInformation, TakesAStoredChecksumWithALeadingZeroForAnother) {
  put("QVSa.dll", "file 1");
  ship("QVSa.dll", "00FB3D30");
  EXPECT_EQ(newFiles(), 1);
  updates_.run("delete from sysfile");
  ship("QVSa.dll", "FB3D30");
  EXPECT_EQ(newFiles(), 0);
}

TEST_F(AgentInformation, LaysTheUpdateProgramBesideTheFilesUnlessANewerOneIsThere) {
  ship("QVSa.dll", "1");
  EXPECT_EQ(newFiles(), 1);
  EXPECT_EQ(updateProgram(), "none") << "none is shipped";
  updates_.run("insert into sysfile(fileName,updtime) values('QVUpdate.exe','20240101')");
  EXPECT_EQ(newFiles(), 1);
  EXPECT_EQ(updateProgram(), "none") << "it has no content yet";
  updates_.run("update sysfile set content=0x6E6577 where fileName='QVUpdate.exe'");
  EXPECT_EQ(newFiles(), 1);
  EXPECT_EQ(updateProgram(), "new");
  put("QVupdate.exe", "own");
  EXPECT_EQ(newFiles(), 1);
  EXPECT_EQ(updateProgram(), "own") << "written after the shipped one";
  updates_.run("update sysfile set updtime='21000101' where fileName='QVUpdate.exe'");
  EXPECT_EQ(newFiles(), 1);
  EXPECT_EQ(updateProgram(), "new");

  std::filesystem::remove(local("QVupdate.exe"));
  std::filesystem::create_directory(local("QVupdate.exe"));
  QVAgent agent;
  EXPECT_EQ(newFiles(agent), 1);
  EXPECT_EQ(agent.errNumber(), messageNumber(2701));
  EXPECT_EQ(agent.errDescription(), "Error in downloading QVupdate.exe.");
}

TEST_F(AgentInformation, TellsTheReleasesAndTheHiddenReports) {
  QVAgent agent;
  agent.connect(server());
  EXPECT_EQ(agent.release() + "|" + agent.DBrelease() + "|" + agent.buildNo() + "|" + agent.hiddenReps(), "8.1|8.1|1|");

  updates_.run("update updateInfo set version='8.0.3',build='9'");
  tables_.run("update roles set roleSpec=N'" + BackupLock{"3.5", "secret"}.cipher() + "' where roleId=4");
  QVAgent other;
  other.connect(server());
  EXPECT_EQ(other.release() + "|" + other.buildNo() + "|" + other.hiddenReps(), "8.0.3||3.5");
  updates_.run("update updateInfo set version='9'");
  QVAgent third;
  third.connect(server());
  EXPECT_EQ(third.buildNo(), "") << "one part is no release to compare";
}

}  // namespace
}  // namespace QVSa::test
