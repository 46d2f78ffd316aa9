#pragma once

#include "bench/Storage.h"
#include "tests/support/TestInstallation.h"

namespace QVSa::bench {

// An installation with as many users as departments, each user in a department of his own, and one role set in every
// department, which the first 5,000 users hold there.
class Workforce {
 public:
  explicit Workforce(int size);

  std::string server() const { return installation_.server(); }
  const std::filesystem::path& folder() const { return installation_.folder(); }
  std::int64_t role() const { return 7; }
  // A second role that is set nowhere.
  std::int64_t idleRole() const { return 8; }
  // The first `count` departments or jobs, comma-separated.
  std::string departmentIds(int count) const;
  std::string jobIds(int count) const;

 private:
  void addDepartments(Storage& storage, int count);
  void addPeople(Storage& storage, int count);

  test::TestInstallation installation_;
};

// Of 1,000, 10,000 and 30,000 users; each is made when it is asked for.
const Workforce& workforce(int size);

}  // namespace QVSa::bench
