#include "QVSa/maintenance/tmpSafe.h"

#include "bindings/c/Class.h"

namespace QVSa::binding {

void describe(Class<tmpSafe>& safe) {
  safe.writeOnly("protectPwd", &tmpSafe::protectPwd)
      .readOnly("errNumber", &tmpSafe::errNumber)
      .readOnly("errDesc", &tmpSafe::errDesc)
      .operation("connect", {"ServerName", optional("DBName", "")}, &tmpSafe::connect, failsWith(false))
      .operation("Save", {optional("changeAll", false)}, &tmpSafe::Save, failsWith(false))
      .operation("getPwd", {"SessionId", "x"}, &tmpSafe::getPwd, failsWith(false));
}

}  // namespace QVSa::binding
