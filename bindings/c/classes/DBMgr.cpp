#include "QVSa/maintenance/DBMgr.h"

#include "bindings/c/Class.h"

namespace QVSa::binding {

void describe(Class<DBMgr>& manager) {
  manager.readOnly("errNumber", &DBMgr::errNumber)
      .readOnly("errDescription", &DBMgr::errDescription)
      .operation("BackUpDB", {"ServerName", "sysFile", "appFile", optional("regPwd", ""), optional("tpPwd", "")},
                 &DBMgr::BackUpDB, failsWith(false))
      .operation("RestoreDB",
                 {"ServerName", "sysFile", "appFile", "saPwd", optional("flag", false), optional("saUid", "sa")},
                 &DBMgr::RestoreDB, failsWith(false))
      .operation("decryptTmps", {"server", "Pwd"}, &DBMgr::decryptTmps, failsWith(false));
}

}  // namespace QVSa::binding
