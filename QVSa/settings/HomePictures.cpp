#include "QVSa/frame/FieldFile.h"
#include "QVSa/settings/Home.h"
#include "QVSa/settings/MachineSettings.h"
#include "platform/Files.h"
#include "platform/Folders.h"
#include "platform/Services.h"

namespace QVSa {

Boolean Home::getImage(const String& server, const String& DBName) {
  if (!Frame::connect(server, DBName)) return false;
  return operation(plain(), [&] {
    Connection connection = open();
    connection.Execute("set nocount on");
    Recordset row = connection.Execute("select * from homeinfo where id=1");
    if (row.EOF_()) return true;
    const String folder = platform::services().programFolder();
    fetchText(row["LoginNewsUrl"], "LoginNewsUrl", LoginNewsUrl_);
    fetchPicture(row, "LoginImage", folder + "\\LoginImage", LoginImageFile_);
    fetchText(row["loginTitle"], "loginTitle", loginTitle_);
    fetchPicture(row, "customFormIcon", folder + "\\formicon.ico", customFormIcon_);
    return true;
  });
}

// What the machine's store refuses is passed over: the login screen can do without.
void Home::fetchText(const Field& column, const String& name, String& value) {
  value = column.asText();
  const auto key = platform::services().openSettings(machineSettingsKey);
  if (!key) return;
  if (value.empty()) {
    key->remove(name);
  } else {
    key->write(name, value);
  }
}

void Home::fetchPicture(Recordset& row, const String& column, const String& path, String& file) {
  if (row[column].isNull()) {
    file.clear();
    if (platform::fileExists(path)) platform::deleteFile(path);
    return;
  }
  if (platform::fileExists(path)) {
    file = path;
    // Every save of the settings sets the stamp, whichever picture it changed.
    const auto modified = platform::lastModified(path);
    const Field stamp = row["updTime"];
    if (modified && !stamp.isNull() && *modified > stamp.asDate()) return;
  }
  String errText;
  if (fieldToFile(row[column], path, errText)) {
    file = path;
  } else {
    file.clear();
    note(errNumber(), errText);
  }
}

void Home::sendPicture(Connection& connection, const String& path, const String& clear, const String& select) {
  if (path.empty()) {
    connection.Execute(clear);
    return;
  }
  Recordset row;
  row.Open(select, connection, adOpenKeyset, adLockOptimistic);
  String errText;
  if (!row.EOF_() && !fileToField(row[0], path, errText)) note(errNumber(), errText);
  connection.Execute("SET NOCOUNT OFF");
  row.Update();
  row.Close();
  connection.Execute("SET NOCOUNT ON");
}

}  // namespace QVSa
