#pragma once

// Every public class of the library, and what hosts need beside them.
//
// Failures. An operation that fails gives its negative result (False, the empty text, no object), and errNumber and
// errDescription of its object tell why. These throw Failure instead:
//   Add of Departments, Roles, Users, userGroups and BKPlans, for a key that is taken and a value that is no number;
//   Item and Remove of Sessions, LogRecords and BKPlans; Count of a collection of more than 32,767 items;
//   BKPlan::newSche, QVAgent::connect, cCRC32, compareVersion, Date and Variant where a value does not convert;
//   User::loginAuth (level 1) and loginAuth_1, for a stored password with a character of two bytes.
// Connection, Recordset and Field throw it always, and what is in memory alone (properties, Item, begin) may throw
// std::bad_alloc. Any other operation that runs out of memory gives its negative result and errNumber 7.
//
// Threads. Objects in different threads are independent of each other; one object, and what it gave out by shared_ptr,
// is for one thread at a time. The library starts no thread of its own.
// Fork. A process that was forked from one that had used an embedded installation gets 0x80004005 from everything that
// reaches one: fork before the first connection, or exec.
// Signals. No handler is set or changed; an export to a pipe without a reader is a failure and no SIGPIPE.
// Nothing else of the process changes either: no locale, no environment, no working folder.
#include "QVSa/classification/AclRule.h"
#include "QVSa/classification/Directory.h"
#include "QVSa/frame/ConnectionString.h"
#include "QVSa/frame/Version.h"
#include "QVSa/hosting/Backups.h"
#include "QVSa/hosting/Collisions.h"
#include "QVSa/hosting/HomeKeeping.h"
#include "QVSa/hosting/Installation.h"
#include "QVSa/hosting/LogPages.h"
#include "QVSa/hosting/Logins.h"
#include "QVSa/hosting/PlanRuns.h"
#include "QVSa/hosting/RuleKeeping.h"
#include "QVSa/hosting/SafeTexts.h"
#include "QVSa/hosting/SecretRotation.h"
#include "QVSa/hosting/ServerAccess.h"
#include "QVSa/hosting/ServerInstallation.h"
#include "QVSa/hosting/SignOn.h"
#include "QVSa/hosting/UserKeeping.h"
#include "QVSa/identity/Session.h"
#include "QVSa/identity/Sessions.h"
#include "QVSa/identity/User.h"
#include "QVSa/identity/safeRule.h"
#include "QVSa/maintenance/BKPlan.h"
#include "QVSa/maintenance/BKPlans.h"
#include "QVSa/maintenance/DBMgr.h"
#include "QVSa/maintenance/QVAgent.h"
#include "QVSa/maintenance/cCRC32.h"
#include "QVSa/maintenance/cSchedule.h"
#include "QVSa/maintenance/tmpSafe.h"
#include "QVSa/numbering/IdMgr.h"
#include "QVSa/numbering/IdMgrs.h"
#include "QVSa/organisation/Department.h"
#include "QVSa/organisation/Departments.h"
#include "QVSa/organisation/Job.h"
#include "QVSa/organisation/Jobs.h"
#include "QVSa/organisation/Role.h"
#include "QVSa/organisation/Roles.h"
#include "QVSa/organisation/Users.h"
#include "QVSa/organisation/userGroup.h"
#include "QVSa/organisation/userGroups.h"
#include "QVSa/settings/Home.h"
#include "QVSa/syslog/LogRecord.h"
#include "QVSa/syslog/LogRecords.h"
