#include "QVSa/maintenance/BKPlan.h"

#include "QVSa/maintenance/cSchedule.h"
#include "bindings/c/Class.h"

namespace QVSa::binding {

void describe(Class<BKPlan>& plan) {
  plan.property<String>("Name", &BKPlan::Name, &BKPlan::Name)
      .readOnly("Id", &BKPlan::Id)
      .property<String>("bkPath", &BKPlan::bkPath, &BKPlan::bkPath)
      .property<std::shared_ptr<cSchedule>>("schedule", &BKPlan::schedule, &BKPlan::schedule)
      .property<Boolean>("delFiles", &BKPlan::delFiles, &BKPlan::delFiles)
      .property<Integer>("delNum", &BKPlan::delNum, &BKPlan::delNum)
      .property<Integer>("delUnit", &BKPlan::delUnit, &BKPlan::delUnit)
      .readOnly("errNumber", &BKPlan::errNumber)
      .readOnly("errDescription", &BKPlan::errDescription)
      .operation("connect", {"server", optional("DBName", "")}, &BKPlan::connect, failsWith(false))
      .operation("GetOne", {optional("keyName", 0), optional("keyValue", "")}, &BKPlan::GetOne, failsWith(false))
      .operation("Save", {}, &BKPlan::Save, failsWith(false))
      .operation("newSche", {}, &BKPlan::newSche)
      .operation("Delete", {optional("Id", 0)}, &BKPlan::Delete, failsWith(false))
      .operation("exec", {"schNo"}, &BKPlan::exec, failsWith(false))
      .enumeration("BKPlanKey", {{"byId", BKPlan::byId}, {"byName", BKPlan::byName}});
}

}  // namespace QVSa::binding
