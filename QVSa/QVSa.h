#pragma once

// Every public class of the library.
#include "QVSa/identity/Session.h"
#include "QVSa/identity/Sessions.h"
#include "QVSa/identity/User.h"
#include "QVSa/identity/safeRule.h"
#include "QVSa/numbering/IdMgr.h"
#include "QVSa/numbering/IdMgrs.h"
#include "QVSa/organisation/Department.h"
#include "QVSa/settings/Home.h"
