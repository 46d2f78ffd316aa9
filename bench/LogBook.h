#pragma once

#include "QVSa/values/Date.h"
#include "bench/Storage.h"
#include "tests/support/TestInstallation.h"

namespace QVSa::bench {

// An installation with a log of 10,000 entries a day, each of a report template: 1,000,000 entries, or as many as the
// environment variable QVSA_LOG_ENTRIES says.
class LogBook {
 public:
  static constexpr std::int64_t entriesADay = 10'000;

  LogBook();

  std::string server() const { return installation_.server(); }
  const std::filesystem::path& folder() const { return installation_.folder(); }
  std::int64_t entries() const { return entries_; }
  // A day in the middle of the log.
  Date day() const;
  std::int64_t dayTicks() const;

 private:
  test::TestInstallation installation_;
  std::int64_t entries_;
};

const LogBook& logBook();

}  // namespace QVSa::bench
