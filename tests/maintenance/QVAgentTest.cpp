#include <array>
#include <cstdio>
#include <filesystem>

#include "QVSa/frame/FieldFile.h"
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
  AgentInformation() : before_(platform::services()) {
    platform::Services services = before_;
    services.programFolder = [this] { return program_.path().string(); };
    platform::replaceServices(services);
  }
  ~AgentInformation() override { platform::replaceServices(before_); }

  String local(const String& name) const { return program_.path().string() + "/" + name; }
  void put(const String& name, const String& content) {
    platform::writeFile(local(name), Bytes(content.begin(), content.end()));
  }
  void ship(const String& name, const String& checksum) {
    updates_.run("insert into sysfile(fileName,tmpdel) values('" + name + "','" +
                 platform::encryptText(checksum, "#4172-Rxt908|") + "')");
  }
  void shipUpdateProgram(const String& content, const String& moment) {
    updates_.run("insert into sysfile(fileName,updtime) values('QVUpdate.exe','" + moment + "')");
    EXPECT_EQ(newFiles(), 1);
    EXPECT_EQ(updateProgram(), "none") << "it has no content yet";
    const TestFolder folder;
    const String path = folder.path().string() + "/content";
    platform::writeFile(path, Bytes(content.begin(), content.end()));
    Connection connection;
    connection.Open(buildConnString(server(), "QVUpdate", false));
    Recordset row;
    row.Open("select fileName,content from sysfile where fileName='QVUpdate.exe'", connection, 1, 3);
    String errText;
    ASSERT_TRUE(fileToField(row["content"], path, errText)) << errText;
    row.Update();
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
  platform::Services before_;
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
  put("QVSa.dll", "file 31");
  QVAgent agent;
  char digits[16];
  std::uint32_t sum = 0;
  // A content whose sum begins with a zero digit.
  for (int i = 0; sum == 0 || sum > 0x0FFFFFFFU; ++i) {
    put("QVSa.dll", "file " + std::to_string(i));
    sum = static_cast<std::uint32_t>(cCRC32().GetFileCrc32(local("QVSa.dll")));
  }
  std::snprintf(digits, sizeof digits, "%08X", sum);
  ship("QVSa.dll", digits);
  EXPECT_EQ(newFiles(agent), 1);
  updates_.run("delete from sysfile");
  ship("QVSa.dll", String(digits).erase(0, String(digits).find_first_not_of('0')));
  EXPECT_EQ(newFiles(agent), 0);
}

TEST_F(AgentInformation, LaysTheUpdateProgramBesideTheFilesUnlessANewerOneIsThere) {
  ship("QVSa.dll", "1");
  EXPECT_EQ(newFiles(), 1);
  EXPECT_EQ(updateProgram(), "none") << "none is shipped";
  shipUpdateProgram("new", "20240101 00:00:00");
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

TEST_F(AgentInformation, RaisesWhatStopsItsConnectionAndReportsTheRest) {
  QVAgent agent;
  EXPECT_EQ(failureOf([&] { agent.connect(server() + "-gone"); }), number::general);
  EXPECT_EQ(agent.newFiles(), -1);
  EXPECT_EQ(agent.errNumber(), number::general);
}

}  // namespace
}  // namespace QVSa::test
