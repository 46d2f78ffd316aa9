#pragma once

#include <utility>

#include "QVSa/values/Values.h"

namespace QVSa {

// The type of entries about the system's upkeep. Other types are the hosts' own.
constexpr Long administrationLog = 3;

// One row of the system log, as a query of LogRecords read it; what the row does not hold is empty.
class QVSA_EXPORT LogRecord {
 public:
  const String& description() const { return description_; }
  void description(String value) { description_ = std::move(value); }
  const String& FuncName() const { return FuncName_; }
  void FuncName(String value) { FuncName_ = std::move(value); }
  const String& Computer() const { return Computer_; }
  void Computer(String value) { Computer_ = std::move(value); }
  // Not filled by the queries, nor is LogType.
  const String& OperatorLogin() const { return OperatorLogin_; }
  void OperatorLogin(String value) { OperatorLogin_ = std::move(value); }
  // The user's name at the time of the entry.
  const String& operator_() const { return operatorName_; }
  void operator_(String value) { operatorName_ = std::move(value); }
  // To the minute, in the default form of a date.
  const String& LogTime() const { return LogTime_; }
  void LogTime(String value) { LogTime_ = std::move(value); }
  Long LogType() const { return LogType_; }
  void LogType(Long value) { LogType_ = value; }

  // Id of the record concerned, and a further id of the caller's.
  const String& rcId() const { return rcId_; }
  const String& wiId() const { return wiId_; }
  // The report template's full name and its id.
  const String& repName() const { return repName_; }
  const String& rtId() const { return rtId_; }
  // Who acted for the user.
  const String& agentName() const { return agentName_; }

 private:
  friend class LogRecords;

  String description_;
  String FuncName_;
  String Computer_;
  String OperatorLogin_;
  String operatorName_;
  String LogTime_;
  Long LogType_ = 0;
  String rcId_;
  String wiId_;
  String repName_;
  String rtId_;
  String agentName_;
};

}  // namespace QVSa
