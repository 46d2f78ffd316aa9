#pragma once

#include "bench/Storage.h"
#include "tests/support/TestInstallation.h"

namespace QVSa::bench {

// An installation of a middle-sized office: a tree of departments, a user for every two of them, a policy, open
// sessions, a numbering rule.
class Office {
 public:
  static constexpr const char* login = "ann";
  static constexpr const char* password = "Quiet-River-7";
  // The computer on which ann signs on.
  static constexpr const char* host = "workstation-ann";
  static constexpr const char* rule = "invoice";
  // The department with all others but the built-in ones below it.
  static constexpr const char* top = "top";

  Office(int departments, int sessions);

  std::string server() const { return installation_.server(); }
  const std::filesystem::path& folder() const { return installation_.folder(); }

 private:
  void addDepartments(Storage& storage, int count);
  void addUsers(Storage& storage, int count);
  void addSessions(Storage& storage, int count);
  void addGroupAndRule(Storage& storage);
  void addAnn();
  void issueFirstNumbers();

  test::TestInstallation installation_;
};

// 800 departments and 1,000 open sessions.
const Office& office();
// 100,000 departments.
const Office& largeOffice();

}  // namespace QVSa::bench
