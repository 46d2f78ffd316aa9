#pragma once

// Every public class of the library.
#include "QVSa/identity/Session.h"
#include "QVSa/identity/Sessions.h"
#include "QVSa/identity/User.h"
#include "QVSa/identity/safeRule.h"
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
