#pragma once

#include <utility>
#include <vector>

#include "QVSa/values/Values.h"

namespace QVSa {

// Texts for the arguments that go into a statement as they are. A host makes them by these, and so lets nothing of a
// stranger's in. What the log's queries take raw, LogPages takes as values.

// "3,17" for the arguments that are lists of ids: User::setJobs, Departments::GetAll, userGroup::SetUsers and others.
// No id gives the empty text, which means "all" to some of them.
QVSA_EXPORT String idList(const std::vector<Long>& ids);
// "12,3|12,4" for Role::UpdateUsers: user and job.
QVSA_EXPORT String idPairs(const std::vector<std::pair<Long, Long>>& pairs);

// Whether the path may stand in the statements of a backup (DBMgr, BKPlan::bkPath): no quote, no control character.
QVSA_EXPORT Boolean isPlainPath(const String& path);
// Whether the name may be the `DBName` of a connect: letters of any script, digits and "_", or nothing.
QVSA_EXPORT Boolean isPlainName(const String& name);

}  // namespace QVSa
