#pragma once

#include "tests/support/PlainSession.h"
#include "tests/support/TestInstallation.h"

namespace QVSa::test {

// Makes what the operations work on, in an installation as it is shipped, and closes its files.
void fillGround(const TestInstallation& installation);

// An installation of its own for each attempt: a copy of a filled one.
class Ground {
 public:
  explicit Ground(const std::filesystem::path& filled) { std::filesystem::copy(filled, folder_.path()); }

  String server() const { return "file:" + folder_.path().string(); }

  // All that the operations write.
  Lines tables() const { return asked("select * from "); }
  // Of each: encrypted texts are never the same twice.
  Lines counts() const { return asked("select count(*) from "); }

 private:
  Lines asked(const String& query) const {
    const PlainSession session(server());
    Lines result;
    for (const char* table :
         {"users",        "userPwdHis", "userJob",   "GrpUser", "agentuser", "saferule",      "seslog",
          "departments",  "jobs",       "idRule",    "idRec",   "idDel",     "QVSys..idRec",  "syslog",
          "RptDirectory", "AclRule",    "QVTmpSafe", "repTmps", "homeinfo",  "QVUserRegInfo", "QVMailQ",
          "roles",        "ItemGroups", "grpRole",   "userMgr", "fldAcl",    "cftJob",        "repAcl",
          "tasks",        "QVBkPlan",   "QVTaskSche"})
      result.push_back(session.text(query + table));
    return result;
  }

  TestFolder folder_;
};

}  // namespace QVSa::test
