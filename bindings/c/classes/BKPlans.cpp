#include "QVSa/maintenance/BKPlans.h"

#include "QVSa/maintenance/BKPlan.h"
#include "bindings/c/Class.h"

namespace QVSa::binding {

void describe(Class<BKPlans>& plans) {
  plans.readOnly("errNumber", &BKPlans::errNumber)
      .readOnly("errDescription", &BKPlans::errDescription)
      .operation("connect", {"server", optional("DBName", "")}, &BKPlans::connect, failsWith(false))
      .operation("Add", {"Id", "Name", input("path")}, &BKPlans::Add)
      .operation("GetAll", {}, &BKPlans::GetAll, failsWith(false))
      .operation("Count", {}, &BKPlans::Count)
      .operation("Remove", {"Index"}, &BKPlans::Remove)
      .operation("Item", {"Index"}, &BKPlans::Item)
      .items<BKPlan>();
}

}  // namespace QVSa::binding
