#include "QVSa/maintenance/BKPlan.h"

#include "QVSa/resources/Messages.h"

namespace QVSa {

std::shared_ptr<cSchedule> BKPlan::schedule() {
  if (!schedule_) schedule_ = std::make_shared<cSchedule>();
  return schedule_;
}

Boolean BKPlan::GetOne(Integer keyName, const String& keyValue) {
  return operation(plain(), [&]() -> Boolean {
    Connection connection = open();
    connection.Execute("set nocount on");
    String statement =
        "select t.*,b.path,b.delOld,b.delNum,b.delUnit"
        " from tasks t,QVBkPlan b"
        " where t.taskId=b.taskId";
    if (keyName == byId) statement += " and t.taskId=<id>";
    if (keyName == byName) statement += " and t.taskName=<name>";
    Recordset row = connection.Execute(sql(statement).number("id", keyValue).text("name", keyValue));
    if (row.EOF_()) return refuse(message::planUnknown);
    read(row);
    delFiles_ = row["delOld"].asBoolean();
    return true;
  });
}

void BKPlan::read(Recordset& row) {
  Id_ = row["taskid"].asLong();
  Name_ = row["taskName"].asText();
  bkPath_ = row["path"].asText();
  delNum_ = row["delNum"].asInteger();
  delUnit_ = row["delUnit"].asInteger();
  cSchedule& when = *schedule();
  when.cycle(row["cycle"].asInteger());
  when.cycleNum(row["cycleNum"].asInteger());
  when.wks(row["wk"].asText());
  when.monthDay(row["md"].asInteger());
  when.timesOneDay(row["tod"].asInteger());
  // A date that was stored with the time has no effect.
  const Date start = row["startTime"].asDate();
  when.StartTime(Date(1899, 12, 30, start.hour(), start.minute(), start.second()));
  when.interval(row["hInterval"].asInteger());
  when.valUnit(row["intervalUnit"].asInteger());
}

Boolean BKPlan::Save() {
  const Long before = Id_;
  const Boolean saved = operation(prefixed(message::planNotSaved).onIntegrity(message::planExists), [&]() -> Boolean {
    const bool isNew = Id_ == 0;
    const String schDesc = schedule()->description();
    noteFailureOfSchedule();
    Connection connection = open();
    connection.Execute("set nocount on");
    connection.BeginTrans();
    if (isNew) {
      if (!insertTask(connection, schDesc)) return false;
    } else {
      updateTask(connection, schDesc);
    }
    connection.Execute(sql("delete from QVTaskSche where taskId=<id> and state=0").number("id", Id_));
    const Date now = connection.Execute("select getdate()")[0].asDate();
    queueNext(connection, now);
    noteFailureOfSchedule();
    connection.CommitTrans();
    return true;
  });
  // The number that a new plan was given went with its rows.
  if (!saved) Id_ = before;
  return saved;
}

SqlText BKPlan::taskSql(const String& statement, const String& schDesc) {
  return sql(statement)
      .number("id", Id_)
      .text("name", Name_)
      .number("cycle", schedule_->cycle())
      .number("cycleNum", schedule_->cycleNum())
      .text("wk", schedule_->wks())
      .number("md", schedule_->monthDay())
      .number("tod", schedule_->timesOneDay())
      .date("startTime", schedule_->StartTime())
      .number("interval", schedule_->interval())
      .number("intervalUnit", schedule_->valUnit())
      .text("schDesc", schDesc);
}

Boolean BKPlan::insertTask(Connection& connection, const String& schDesc) {
  connection.Execute(
      taskSql("insert into tasks(taskName,taskType,cTime,schType,cycle,cycleNum,wk,md,tod,startTime,hInterval,"
              "intervalUnit,schDesc)"
              "values(<name>,2,getdate(),1,<cycle>,<cycleNum>,<wk>,<md>,<tod>,<startTime>,<interval>,<intervalUnit>,"
              "<schDesc>)",
              schDesc));
  Recordset row = connection.Execute("select scope_identity()");
  if (row.EOF_()) return refuse(message::planNotAdded);
  Id_ = row[0].asLong();
  row.Close();
  connection.Execute(sql("insert into qvbkplan(taskId,path,delOld,delNum,delUnit) "
                         "values(<id>,<path>," +
                         text(delFiles_ ? -1 : 0) + "," + text(delNum_) + "," + text(delUnit_) + ")")
                         .number("id", Id_)
                         .text("path", bkPath_));
  return true;
}

void BKPlan::updateTask(Connection& connection, const String& schDesc) {
  connection.Execute(
      taskSql("update tasks set "
              "taskName=<name>"
              ",cycle=<cycle>,cycleNum=<cycleNum>"
              ",wk=<wk>,md=<md>"
              ",tod=<tod>,startTime=<startTime>,hInterval=<interval>"
              ",intervalUnit=<intervalUnit>"
              ",schDesc=<schDesc>"
              " where taskId=<id>",
              schDesc));
  connection.Execute(sql("update qvbkplan set path=<path>"
                         ",delOld=" +
                         text(delFiles_ ? -1 : 0) + ",delNum=" + text(delNum_) + ",delUnit=" + text(delUnit_) +
                         " Where taskId =<id>")
                         .number("id", Id_)
                         .text("path", bkPath_));
}

void BKPlan::noteFailureOfSchedule() {
  if (!schedule_->hasAnswered_) note(schedule_->errNumber(), schedule_->errDescription());
}

void BKPlan::queueNext(Connection& connection, Date serverTime) {
  connection.Execute(sql("insert into QVTaskSche(taskId,schNo,pTime)"
                         " select <id>,isnull(max(schNo),0)+1,<pTime>"
                         " from QVTaskSche where taskId=<id>")
                         .number("id", Id_)
                         .date("pTime", schedule()->GetNextTime(serverTime)));
}

void BKPlan::newSche() {
  Connection connection = open();
  Recordset row;
  row.Open(sql("select count(*),getdate() from qvTaskSche"
               " where taskId=<id> and state=0 and pTime>=getdate()")
               .number("id", Id_),
           connection);
  const Long pending = row[0].asLong();
  const Date now = row[1].asDate();
  row.Close();
  if (pending == 0) queueNext(connection, now);
}

Boolean BKPlan::Delete(Long Id) {
  return operation(prefixed(message::planNotDeleted), [&] {
    const Long plan = Id != 0 ? Id : Id_;
    Connection connection = open();
    connection.Execute("set nocount on");
    connection.BeginTrans();
    connection.Execute("delete from tasks where taskid=" + text(plan));
    connection.Execute("delete from qvbkplan where taskid=" + text(plan));
    connection.Execute("delete from QVTaskSche where taskid=" + text(plan));
    connection.CommitTrans();
    return true;
  });
}

}  // namespace QVSa
