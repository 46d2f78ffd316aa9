#include "QVSa/numbering/IdMgr.h"

#include "bindings/c/Class.h"

namespace QVSa::binding {

void describe(Class<IdMgr>& rule) {
  rule.property<String>("preFix", &IdMgr::preFix, &IdMgr::preFix)
      .property<Integer>("DateFormat", &IdMgr::DateFormat, &IdMgr::DateFormat)
      .property<Integer>("numPlace", &IdMgr::numPlace, &IdMgr::numPlace)
      .property<Integer>("reuseStyle", &IdMgr::reuseStyle, &IdMgr::reuseStyle)
      .property<Boolean>("whenSave", &IdMgr::whenSave, &IdMgr::whenSave)
      .property<String>("idName", &IdMgr::idName, &IdMgr::idName)
      .readOnly("errNumber", &IdMgr::errNumber)
      .readOnly("errDescription", &IdMgr::errDescription)
      .operation("connect", {"server", optional("DBName", "")}, &IdMgr::connect, failsWith(false))
      .operation(
          "newId",
          {"idName", optional("vConnstring", ""), optional("startNo", -1), optional("rcId", ""), optional("sesId", "")},
          &IdMgr::newId, failsWith(""))
      .operation("setStartNo", {"startNo"}, &IdMgr::setStartNo, failsWith(false))
      .operation("GetOne", {"idName"}, &IdMgr::GetOne, failsWith(false))
      .operation("Delete", {optional("idName", "")}, &IdMgr::Delete, failsWith(false))
      .operation("Save", {}, &IdMgr::Save, failsWith(false))
      .operation("Rename", {"strOld", "strNew"}, &IdMgr::Rename, failsWith(false))
      .operation("GetSample", {}, &IdMgr::GetSample)
      .operation("InvalidNumbers", {optional("Name", "")}, &IdMgr::InvalidNumbers, failsWith("fail"))
      .enumeration("qvIdDatePart", {{"noDate", noDate},
                                    {"yymm", yymm},
                                    {"yyyymm", yyyymm},
                                    {"yymmdd", yymmdd},
                                    {"yyyymmdd", yyyymmdd},
                                    {"yy", yy},
                                    {"yyyy", yyyy}})
      .enumeration("qvIdReuse",
                   {{"noReuse", noReuse}, {"sameDay", sameDay}, {"sameMonth", sameMonth}, {"anyone", anyone}});
}

}  // namespace QVSa::binding
