#include <gtest/gtest.h>

#include "tests/support/Cases.h"
#include "tests/support/TestServer.h"

namespace QVSa::test {

const std::filesystem::path sources = QVSA_SOURCE_DIR;

TEST(TheEngine, AnswersAsTheRecordedServerDid) {
  const std::filesystem::path recorded = sources.parent_path() / "shared" / "tsql";
  if (!std::filesystem::is_directory(recorded))
    GTEST_SKIP() << "the recorded cases are not here; the project's own cases stand alone";
  runCases(recorded, TestInstallation::Content::empty);
}

TEST(TheEngine, AnswersTheProjectsOwnCases) {
  if (onServer()) GTEST_SKIP() << "they are of the engine alone";
  runCases(sources / "tests/tsql", TestInstallation::Content::empty);
}

}  // namespace QVSa::test
