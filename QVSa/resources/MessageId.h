#pragma once

#include "QVSa/values/Values.h"

// The messages that tell a failure, alone or before the text of its cause. An operation that fails with one of them has
// the errNumber messageNumber(id):
//   if (!user.GetOne(User::byLogin, login) && user.errNumber() == messageNumber(message::userUnknown)) ...
namespace QVSa::message {

enum Id : Long {
  departmentUnknown = 1001,
  departmentIncomplete = 1002,
  superiorUnknown = 1003,
  departmentHasChildren = 1004,
  departmentHasUsers = 1006,

  userUnknown = 1101,
  userIncomplete = 1102,
  rowNotAdded = 1103,
  passwordWrong = 1106,
  userNotDeleted = 1109,
  supervisorJobMissing = 1112,
  supervisorUserMissing = 1113,
  supervisorNotSet = 1114,
  supervisorNotRead = 1115,
  subordinatesNotListed = 1116,
  usersNotListed = 1117,
  lockedOut = 1118,
  passwordExpired = 1119,
  passwordUsedBefore = 1120,
  oldPasswordWrong = 1121,
  domainPasswordWrong = 1123,
  notRegistered = 1130,
  notInDirectory = 1131,
  addressNotPermitted = 1132,
  signedOnElsewhere = 1133,

  roleUnknown = 1201,
  roleIncomplete = 1202,
  roleNotAdded = 1203,
  roleNotUpdated = 1204,
  roleNotDeleted = 1205,
  holdersNotListed = 1206,
  rolesNotListed = 1207,
  roleJobsNotSet = 1208,
  roleExists = 1209,
  roleNotInDepartment = 1210,

  classUnknown = 1400,

  numberNameMissing = 1501,
  numberRuleUnknown = 1502,
  numberNotIssued = 1503,
  numberRuleNotDeleted = 1504,
  numberRuleNotSaved = 1505,
  numberRuleExists = 1506,
  numbersUsedUp = 1507,
  numbersIssued = 1508,

  sessionsNotListed = 1601,
  sessionNotOpened = 1602,
  sessionNotClosed = 1603,

  logNotWritten = 1701,
  logNotRead = 1702,
  logNotCleared = 1703,
  logNotExported = 1704,

  groupIncomplete = 1800,
  groupExists = 1801,
  groupNotAdded = 1802,
  groupNotUpdated = 1803,
  groupNotDeleted = 1804,
  groupUnknown = 1805,
  groupRolesNotSet = 1806,
  groupRolesNotRead = 1807,
  groupMembersNotSet = 1808,
  groupsNotListed = 1809,

  consoleNotDownloaded = 2701,

  applicationBackupMissing = 2903,
  systemBackupMissing = 2904,
  notRestored = 2905,
  notBackedUp = 2906,
  backupDamaged = 2907,
  protectionPasswordWrong = 2909,

  againstPolicy = 3000,

  planUnknown = 3100,
  planNotAdded = 3101,
  backupFailed = 3103,
  plansNotListed = 3104,
  planNotDeleted = 3114,
  planNotSaved = 3115,
  planExists = 3116,

  readingIllegal = 33301,
  readingFailed = 33302,
};

}  // namespace QVSa::message
