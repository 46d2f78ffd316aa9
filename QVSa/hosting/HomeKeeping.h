#pragma once

#include "QVSa/settings/Home.h"

namespace QVSa {

// Saves of the settings that change what was set on the object and nothing else: Home::Save clears the pictures, the
// title and the news page of the login screen where getImage did not bring them to this machine before.
//   HomeKeeping keeping;  keeping.connect(server);
//   Home home;  if (!keeping.load(home)) ...  home.Fax("12");  if (!keeping.save(home)) ...
class QVSA_EXPORT HomeKeeping : private Frame {
 public:
  using Frame::connect;
  using Frame::errDescription;
  using Frame::errNumber;

  // Loads the settings with title, news page and pictures. The pictures lie in a folder of this object's own, for this
  // account alone, that goes with it: LoginImageFile and customFormIcon are paths in there. Set either to another file
  // to replace the picture, and to an empty text to clear it.
  Boolean load(Home& home);
  // Saves them, after load. A picture that can't be read is a failure here (53 no such file), before anything is
  // stored.
  Boolean save(Home& home);
  // The port of the directory server, which no Home can set.
  Boolean setDirectoryPort(Long port);
  // Writes the pictures to the files LoginImage and formicon.ico of a folder, and removes such a file where there is no
  // picture. The paths come back in the two arguments, empty for none.
  Boolean fetchPictures(const String& folder, String& loginImage, String& icon);

 private:
  class PrivateFolder;

  static void fetch(Recordset& row, const String& folder, String& loginImage, String& icon);
  Recordset row(Connection& connection);

  std::shared_ptr<PrivateFolder> folder_;
};

}  // namespace QVSa
