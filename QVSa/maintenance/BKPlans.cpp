#include "QVSa/maintenance/BKPlans.h"

namespace QVSa {

std::shared_ptr<BKPlan> BKPlans::Add(Long Id, const String& Name, String* path) {
  auto plan = std::make_shared<BKPlan>();
  plan->Id_ = Id;
  plan->Name(Name);
  if (path != nullptr) plan->bkPath(*path);
  connectAlike(*plan);
  items_.add(plan, Name);
  return plan;
}

Boolean BKPlans::GetAll() {
  return operation(prefixed(message::plansNotListed), [&] {
    Connection connection = open();
    Recordset row;
    for (row.Open("select t.*,b.path,b.delOld,b.delNum,b.delUnit"
                  " from tasks t,QVBkPlan b"
                  " where t.taskId=b.taskId",
                  connection);
         !row.EOF_(); row.MoveNext()) {
      auto plan = std::make_shared<BKPlan>();
      connectAlike(*plan);
      plan->read(row);
      plan->delFiles(row["delOld"].isOne());
      items_.add(plan, plan->Name());
    }
    return true;
  });
}

Integer BKPlans::Count() const { return Variant(static_cast<Long>(items_.size())).toInteger(); }

std::shared_ptr<BKPlan> BKPlans::Item(const Variant& Index) const {
  try {
    return items_.at(Index);
  } catch (const Failure&) {
    return nullptr;
  }
}

}  // namespace QVSa
