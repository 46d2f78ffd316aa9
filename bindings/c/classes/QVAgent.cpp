#include "QVSa/maintenance/QVAgent.h"

#include "bindings/c/Class.h"

namespace QVSa::binding {

void describe(Class<QVAgent>& agent) {
  agent.readOnly("release", &QVAgent::release)
      .readOnly("DBrelease", &QVAgent::DBrelease)
      .readOnly("hiddenReps", &QVAgent::hiddenReps)
      .readOnly("buildNo", &QVAgent::buildNo)
      .readOnly("errNumber", &QVAgent::errNumber)
      .readOnly("errDescription", &QVAgent::errDescription)
      .operation("connect", {"server"}, &QVAgent::connect)
      .operation("newFiles", {}, &QVAgent::newFiles, failsWith(-1));
}

}  // namespace QVSa::binding
