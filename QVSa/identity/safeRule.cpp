#include "QVSa/identity/safeRule.h"

#include <algorithm>

#include "QVSa/resources/Messages.h"

namespace QVSa {
namespace {

// A flag as it goes into the statement: -1 or 0, which the column, a bit, reads as 1 or 0.
String flag(Boolean value) { return text(value ? -1 : 0); }

Boolean has(const String& s, char first, char last) {
  return std::any_of(s.begin(), s.end(), [&](char c) { return first <= c && c <= last; });
}

Boolean isLetterOrDigit(char c) { return ('A' <= c && c <= 'Z') || ('a' <= c && c <= 'z') || ('0' <= c && c <= '9'); }

}  // namespace

Boolean safeRule::GetOne() {
  return operation(plain(), [&] {
    Connection connection = open();
    Recordset row = connection.Execute("select * from saferule where id=1");
    // Taken over when it was read to its end: nothing is to be judged by half a policy.
    safeRule whole = *this;
    row.EOF_() ? whole.clear() : whole.read(row);
    whole.loaded_ = true;
    *this = whole;
    return true;
  });
}

void safeRule::clear() {
  minLen_ = maxDay_ = cycle_ = errTimes_ = sleepMinutes_ = 0;
  caseMixed_ = numCharMixed_ = hasSpecialChar_ = lockExp_ = lockErr_ = awakeAuto_ = awakeManual_ = false;
}

void safeRule::read(Recordset& row) {
  minLen_ = row["minLen"].asInteger();
  maxDay_ = row["maxDay"].asInteger();
  const String rules = row["charSet"].asText() + "000";
  caseMixed_ = rules[0] == '1';
  numCharMixed_ = rules[1] == '1';
  hasSpecialChar_ = rules[2] == '1';
  cycle_ = row["cycle"].asInteger();
  lockExp_ = row["lockExp"].asBoolean();
  lockErr_ = row["lockErr"].asBoolean();
  errTimes_ = row["errTimes"].asInteger();
  awakeAuto_ = row["awa"].asBoolean();
  sleepMinutes_ = row["sleepnn"].asInteger();
  awakeManual_ = row["awm"].asBoolean();
}

Boolean safeRule::Save() {
  return operation(plain(), [&] {
    Connection connection = open();
    connection.BeginTrans();
    if (connection.Execute("select * from saferule where id=1").EOF_()) {
      connection.Execute(
          "insert into safeRule("
          "id,minLen,maxDay,charSet,"
          "cycle,lockExp,lockErr,errTimes,"
          "awa,sleepNn,awm)"
          " values(1," +
          text(minLen_) + "," + text(maxDay_) + ",'" + charSet() + "'," + text(cycle_) + "," + flag(lockExp_) + "," +
          flag(lockErr_) + "," + text(errTimes_) + "," + flag(awakeAuto_) + "," + text(sleepMinutes_) + "," +
          flag(awakeManual_) + ")");
    } else {
      connection.Execute(
          "update safeRule set "
          "minLen=" +
          text(minLen_) + ",maxDay=" + text(maxDay_) + ",charset='" + charSet() + "'" + ",cycle=" + text(cycle_) +
          ",lockExp=" + flag(lockExp_) + ",lockerr=" + flag(lockErr_) + ",errTimes=" + text(errTimes_) +
          ",awa=" + flag(awakeAuto_) + ",sleepnn=" + text(sleepMinutes_) + ",awm=" + flag(awakeManual_));
    }
    if (!lockErr_) connection.Execute("update users set accstate=0,lockDate=null where accstate=1");
    connection.CommitTrans();
    loaded_ = true;
    return true;
  });
}

String safeRule::charSet() const {
  return String() + (caseMixed_ ? '1' : '0') + (numCharMixed_ ? '1' : '0') + (hasSpecialChar_ ? '1' : '0');
}

Boolean safeRule::checkPwd(const String& s) try {
  if (!loaded_ && !GetOne() && errNumber() == number::memory) return false;
  note(errNumber(), "");

  String problems;
  if (minLen_ >= 1 && textLength(s) < minLen_) problems = fillMsg(LoadResString(3001), {minLen_});
  problems += missingCharacters(s);
  if (problems.empty()) return true;
  // One number for every rule of the policy, whatever the message.
  note(messageNumber(message::againstPolicy), problems);
  return false;
} catch (...) {
  return refuseButFailures();
}

String safeRule::missingCharacters(const String& s) const {
  const Boolean capital = has(s, 'A', 'Z');
  const Boolean small = has(s, 'a', 'z');
  String problems;
  if (caseMixed_ && !(capital && small)) problems += LoadResString(3002);
  if (numCharMixed_ && !(has(s, '0', '9') && (capital || small))) problems += LoadResString(3003);
  if (hasSpecialChar_ && std::all_of(s.begin(), s.end(), isLetterOrDigit)) problems += LoadResString(3004);
  return problems;
}

}  // namespace QVSa
