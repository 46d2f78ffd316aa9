#include "QVSa/maintenance/QVAgent.h"

#include <array>
#include <cstdio>

#include "QVSa/frame/ConnectionString.h"
#include "QVSa/frame/FieldFile.h"
#include "QVSa/frame/Version.h"
#include "QVSa/maintenance/cCRC32.h"
#include "QVSa/maintenance/internal/BackupLock.h"
#include "platform/Files.h"
#include "platform/Folders.h"
#include "platform/SecretMessage.h"
#include "platform/Services.h"

namespace QVSa {

namespace {

constexpr const char* checksumKey = "#4172-Rxt908|";

bool isNotOlder(const String& version, const String& than) {
  const Integer order = compareVersion(version, than);
  return order == 0 || order == 2;
}

// Upper case, no leading zeros.
String hexadecimal(Long bits) {
  std::array<char, 16> buffer;
  std::snprintf(buffer.data(), buffer.size(), "%X", static_cast<unsigned>(bits));
  return buffer.data();
}

String besideProgram(const String& name) { return platform::services().programFolder() + "\\" + name; }

}  // namespace

void QVAgent::openUpdates() {
  if (connection_.State() != 1) connection_.Open(buildConnString(server(), "QVUpdate", false));
}

void QVAgent::connect(const String& server) {
  setServer(server);
  openUpdates();
  if (Recordset row = connection_.Execute("select release from QVSys..sysinfo"); !row.EOF_())
    DBrelease_ = row[0].asText();
  if (Recordset row = connection_.Execute("select * from updateInfo"); !row.EOF_()) {
    release_ = row["version"].asText();
    if (isNotOlder(release_, "8.1")) buildNo_ = row["build"].asText();
  }
  Recordset row = connection_.Execute("select roleSpec from QVSys..roles where roleName='Report Owners'");
  if (row.EOF_() || row[0].isNull()) return;
  if (const auto lock = BackupLock::read(row[0].asText())) hiddenReps_ = lock->list;
}

Integer QVAgent::newFiles() {
  return operation(plain(), Integer{-1}, [&](Integer& result) {
    openUpdates();
    const bool current = isCurrent();
    if (!current) fetchUpdateProgram();
    result = current ? 0 : 1;
  });
}

Boolean QVAgent::isCurrent() {
  const String files = "QVSa.dll,QVData.dll,QVCompiler.dll,QVSvr.dll,QVClient.dll,QVAdmin.exe,QVIMC.exe";
  Recordset row = connection_.Execute(
      "select fileName,tmpadd,tmpdel,tmpspec,tmpdesc,tmpent "
      "from QVUpdate..sysfile "
      "where fileName in ('" +
      replaceAll(files, ",", "','") + "')");
  for (; !row.EOF_(); row.MoveNext()) {
    const String local = besideProgram(row["fileName"].asText());
    if (!platform::fileExists(local)) return false;
    const String shipped = platform::decryptText(row["tmpDel"].asText(), checksumKey);
    if (shipped != hexadecimal(cCRC32().GetFileCrc32(local))) return false;
  }
  return true;
}

void QVAgent::fetchUpdateProgram() {
  const String local = besideProgram("QVupdate.exe");
  Recordset row = connection_.Execute("select content,updtime from sysfile where filename='QVUpdate.exe'");
  if (row.EOF_()) return;
  const auto modified = platform::lastModified(local);
  if (modified && row["updtime"].asDate() <= *modified) return;
  String errText;
  if (!fieldToFile(row["Content"], local, errText)) note(message::consoleNotDownloaded);
}

}  // namespace QVSa
