#include "QVSa/syslog/LogRecord.h"

#include "bindings/c/Class.h"

namespace QVSa::binding {

void describe(Class<LogRecord>& record) {
  record.property<String>("description", &LogRecord::description, &LogRecord::description)
      .property<String>("FuncName", &LogRecord::FuncName, &LogRecord::FuncName)
      .property<String>("Computer", &LogRecord::Computer, &LogRecord::Computer)
      .property<String>("OperatorLogin", &LogRecord::OperatorLogin, &LogRecord::OperatorLogin)
      .property<String>("operator", &LogRecord::operator_, &LogRecord::operator_)
      .property<String>("LogTime", &LogRecord::LogTime, &LogRecord::LogTime)
      .property<Long>("LogType", &LogRecord::LogType, &LogRecord::LogType)
      .readOnly("rcId", &LogRecord::rcId)
      .readOnly("wiId", &LogRecord::wiId)
      .readOnly("repName", &LogRecord::repName)
      .readOnly("rtId", &LogRecord::rtId)
      .readOnly("agentName", &LogRecord::agentName);
}

}  // namespace QVSa::binding
