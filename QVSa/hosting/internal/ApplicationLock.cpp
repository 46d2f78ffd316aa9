#include "QVSa/hosting/internal/ApplicationLock.h"

#include "QVSa/frame/SQLFactory.h"

namespace QVSa {

ApplicationLock::ApplicationLock(Connection connection, const String& name, Long seconds)
    : connection_(std::move(connection)) {
  SQLFactory factory;
  factory.AddPara("name", paraText, name, false, true);
  connection_.CommandTimeout(seconds);
  // The procedure's own time-out is told by its return code alone, that of the command is a failure.
  connection_.Execute(factory.fill("begin transaction exec sp_getapplock <name>,'Exclusive'"));
}

}  // namespace QVSa
