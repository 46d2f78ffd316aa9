#include "QVSa/hosting/HomeKeeping.h"

#include <cstdlib>
#include <filesystem>

#include "QVSa/frame/FieldFile.h"
#include "platform/Files.h"

namespace QVSa {

namespace {

namespace fs = std::filesystem;

// Gives the file's path, or an empty text where there is no picture.
String fetchPicture(const Field& column, const String& path) {
  if (column.isNull()) {
    platform::deleteFile(path);
    return "";
  }
  String errText;
  if (!fieldToFile(column, path, errText)) throw Failure(number::pathAccess, "HomeKeeping", errText);
  return path;
}

void requireReadable(const String& picture) {
  if (!picture.empty()) platform::readFile(picture);
}

}  // namespace

class HomeKeeping::PrivateFolder {
 public:
  PrivateFolder() {
    String name = (fs::temp_directory_path() / "qvsa-XXXXXX").string();
    if (mkdtemp(name.data()) == nullptr) throw runtimeFailure(number::pathAccess);
    path_ = name;
  }
  ~PrivateFolder() {
    std::error_code ignored;
    fs::remove_all(path_, ignored);
  }
  PrivateFolder(const PrivateFolder&) = delete;
  PrivateFolder& operator=(const PrivateFolder&) = delete;
  const String& path() const { return path_; }

 private:
  String path_;
};

Boolean HomeKeeping::load(Home& home) {
  return operation(plain(), [&]() -> Boolean {
    if (!home.connect(server(), DBName())) return refuseAs(home);
    const auto folder = std::make_shared<PrivateFolder>();
    Connection connection = open();
    Recordset settings = row(connection);
    if (settings.EOF_()) return true;
    String loginImage, icon;
    home.LoginNewsUrl(settings["LoginNewsUrl"].asText());
    home.loginTitle(settings["loginTitle"].asText());
    fetch(settings, folder->path(), loginImage, icon);
    home.LoginImageFile(loginImage);
    home.customFormIcon(icon);
    folder_ = folder;
    return true;
  });
}

Boolean HomeKeeping::save(Home& home) {
  return operation(plain(), [&]() -> Boolean {
    requireReadable(home.LoginImageFile());
    requireReadable(home.customFormIcon());
    if (!home.Save()) return refuseAs(home);
    return true;
  });
}

Boolean HomeKeeping::setDirectoryPort(Long port) {
  return operation(plain(), [&] {
    Connection connection = open();
    connection.Execute("update homeinfo set LDport=" + text(port) + " where id=1");
    return true;
  });
}

Boolean HomeKeeping::fetchPictures(const String& folder, String& loginImage, String& icon) {
  return operation(plain(), [&] {
    Connection connection = open();
    Recordset settings = row(connection);
    if (!settings.EOF_()) fetch(settings, folder, loginImage, icon);
    return true;
  });
}

Recordset HomeKeeping::row(Connection& connection) {
  return connection.Execute("select LoginNewsUrl,loginTitle,LoginImage,customFormIcon from homeinfo where id=1");
}

void HomeKeeping::fetch(Recordset& row, const String& folder, String& loginImage, String& icon) {
  loginImage = fetchPicture(row["LoginImage"], folder + "/LoginImage");
  icon = fetchPicture(row["customFormIcon"], folder + "/formicon.ico");
}

}  // namespace QVSa
