#include "QVSa/identity/safeRule.h"

#include "bindings/c/Class.h"

namespace QVSa::binding {

void describe(Class<safeRule>& rule) {
  rule.property<Integer>("minLen", &safeRule::minLen, &safeRule::minLen)
      .property<Integer>("maxDay", &safeRule::maxDay, &safeRule::maxDay)
      .property<Boolean>("caseMixed", &safeRule::caseMixed, &safeRule::caseMixed)
      .property<Boolean>("numCharMixed", &safeRule::numCharMixed, &safeRule::numCharMixed)
      .property<Boolean>("hasSpecialChar", &safeRule::hasSpecialChar, &safeRule::hasSpecialChar)
      .property<Integer>("cycle", &safeRule::cycle, &safeRule::cycle)
      .property<Boolean>("lockErr", &safeRule::lockErr, &safeRule::lockErr)
      .property<Boolean>("lockExp", &safeRule::lockExp, &safeRule::lockExp)
      .property<Boolean>("awakeAuto", &safeRule::awakeAuto, &safeRule::awakeAuto)
      .property<Integer>("sleepMinutes", &safeRule::sleepMinutes, &safeRule::sleepMinutes)
      .property<Boolean>("awakeManual", &safeRule::awakeManual, &safeRule::awakeManual)
      .readOnly("errNumber", &safeRule::errNumber)
      .readOnly("errDescription", &safeRule::errDescription)
      .property<Integer>("errTimes", &safeRule::errTimes, &safeRule::errTimes)
      .operation("connect", {"server", optional("DBName", "")}, &safeRule::connect, failsWith(false))
      .operation("GetOne", {}, &safeRule::GetOne, failsWith(false))
      .operation("Save", {}, &safeRule::Save, failsWith(false))
      .operation("checkPwd", {"s"}, &safeRule::checkPwd);
}

}  // namespace QVSa::binding
