#pragma once

// Every public class of the library.
#include "QVSa/classification/AclRule.h"
#include "QVSa/classification/Directory.h"
#include "QVSa/identity/Session.h"
#include "QVSa/identity/Sessions.h"
#include "QVSa/identity/User.h"
#include "QVSa/identity/safeRule.h"
#include "QVSa/maintenance/tmpSafe.h"
#include "QVSa/numbering/IdMgr.h"
#include "QVSa/numbering/IdMgrs.h"
#include "QVSa/organisation/Department.h"
#include "QVSa/syslog/LogRecord.h"
#include "QVSa/syslog/LogRecords.h"
