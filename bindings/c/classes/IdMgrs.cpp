#include "QVSa/numbering/IdMgrs.h"

#include "QVSa/numbering/IdMgr.h"
#include "bindings/c/Class.h"

namespace QVSa::binding {

void describe(Class<IdMgrs>& rules) {
  rules.property<String>("gsDBConnString", &IdMgrs::gsDBConnString, &IdMgrs::gsDBConnString)
      .readOnly("errNumber", &IdMgrs::errNumber)
      .readOnly("errDescription", &IdMgrs::errDescription)
      .operation("connect", {"server", optional("DBName", "")}, &IdMgrs::connect, failsWith(false))
      .operation("GetAll", {}, &IdMgrs::GetAll, failsWith(false))
      .operation("Item", {"vntIndexKey"}, &IdMgrs::Item)
      .operation("Count", {}, &IdMgrs::Count)
      .items<IdMgr>();
}

}  // namespace QVSa::binding
