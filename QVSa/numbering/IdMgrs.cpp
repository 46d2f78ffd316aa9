#include "QVSa/numbering/IdMgrs.h"

namespace QVSa {

Boolean IdMgrs::GetAll() {
  return operation(plain(), [&] {
    Connection connection;
    connection.CursorLocation(adUseClient);
    connection.Open(gsDBConnString());
    items_.clear();
    Recordset row;
    for (row.Open("select * from idRule where predefined=0", connection, adOpenDynamic, adLockOptimistic); !row.EOF_();
         row.MoveNext()) {
      auto rule = std::make_shared<IdMgr>();
      rule->idName(trim(row["idname"].asText()));
      rule->preFix(trim(row["prefix"].asText()));
      rule->DateFormat(row["ymdStyle"].asInteger());
      rule->numPlace(row["noStyle"].asInteger());
      rule->reuseStyle(row["reuseStyle"].asInteger());
      rule->whenSave(row["nws"].asInteger() != 0);
      connectAlike(*rule);
      items_.add(rule);
    }
    return true;
  });
}

std::shared_ptr<IdMgr> IdMgrs::Item(const Variant& vntIndexKey) const {
  try {
    return items_.at(vntIndexKey);
  } catch (const Failure&) {
    return nullptr;
  }
}

}  // namespace QVSa
