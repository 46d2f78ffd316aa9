#pragma once

#include "tests/support/EnvironmentLocale.h"
#include "tests/support/Scene.h"

namespace QVSa::test {

// An empty log of QVApp in an English system; it is 7 March 2024, 14:05:09.
class LogInstallation : public Scene {
 protected:
  LogInstallation() {
    clock_.set(Date(2024, 3, 7, 14, 5, 9));
    log_.connect(server(), "QVApp");
    tables_.run(
        "insert into repTmps(rtUid,fullName) values('t1','Finance,Sales') insert into repTmps(rtUid,fullName) "
        "values('t2','Stock')");
  }

  // An entry with its id, as any other program may write one.
  void write(const String& logId, const String& time, const String& more = "", const String& values = "",
             Long type = 0) const {
    tables_.run("insert into syslog(logId,logtype,LogTime" + more + ") values('" + logId + "'," + text(type) + ",'" +
                time + "'" + values + ")");
  }

  // The ids of the last query's rows, in order.
  String found() {
    String ids;
    for (Recordset& rows = log_.recordset(); !rows.EOF_(); rows.MoveNext())
      ids += (ids.empty() ? "" : " ") + rows["logId"].asText();
    return ids;
  }

  EnvironmentLocale locale_{"en_US.UTF-8"};
  LogRecords log_;
};

}  // namespace QVSa::test
