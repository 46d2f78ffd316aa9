#include "QVSa/classification/Directory.h"

#include "bindings/c/Class.h"

namespace QVSa::binding {

void describe(Class<Directory>& directory) {
  directory.property<Integer>("ordNo", &Directory::ordNo, &Directory::ordNo)
      .property<String>("ordPath", &Directory::ordPath, &Directory::ordPath)
      .property<String>("Class", &Directory::Class, &Directory::Class)
      .property<String>("superClass", &Directory::superClass, &Directory::superClass)
      .property<String>("fullName", &Directory::fullName, &Directory::fullName)
      .property<Long>("creUserId", &Directory::creUserId, &Directory::creUserId)
      .property<String>("creUserName", &Directory::creUserName, &Directory::creUserName)
      .property<Date>("createTime", &Directory::createTime, &Directory::createTime)
      .property<Long>("updUserId", &Directory::updUserId, &Directory::updUserId)
      .property<String>("upduserName", &Directory::upduserName, &Directory::upduserName)
      .property<Date>("updTime", &Directory::updTime, &Directory::updTime)
      .property<Boolean>("otherCanDesign", &Directory::otherCanDesign, &Directory::otherCanDesign)
      .readOnly("errNumber", &Directory::errNumber)
      .readOnly("errDescription", &Directory::errDescription)
      .operation("connect", {"server", optional("DBName", "")}, &Directory::connect, failsWith(false))
      .operation("GetAll", {optional("SuperDir", "")}, &Directory::GetAll, failsWith(""))
      .operation("GetOne", {"keyName", "keyValue"}, &Directory::GetOne, failsWith(false))
      .operation("Save", {}, &Directory::Save, failsWith(false))
      .operation("Delete", {optional("Class", "")}, &Directory::Delete, failsWith(false))
      .operation("updateSubOrder", {"SuperOrdPath", "SubDirs"}, &Directory::updateSubOrder, failsWith(false));
}

}  // namespace QVSa::binding
