#include <fcntl.h>
#include <fstream>
#include <gtest/gtest.h>

#include "QVSa/values/Failure.h"
#include "providers/embedded/storage/RowLocks.h"
#include "tests/embedded/ChildProcess.h"
#include "tests/embedded/InstallationFolder.h"

namespace QVSa::embedded {
namespace {

class RowLocksOfAFile : public testing::Test {
 protected:
  RowLocksOfAFile() { std::ofstream(file_).put('\n'); }

  InstallationFolder folder_{false};
  std::filesystem::path file_ = folder_.root() / "QVSys.lock";
};

TEST_F(RowLocksOfAFile, ARowBelongsToOneSessionAtATime) {
  RowLocks mine(file_), yours(file_);
  EXPECT_TRUE(mine.tryLock("idRec", 7));
  EXPECT_TRUE(mine.tryLock("IDREC", 7));
  EXPECT_FALSE(yours.tryLock("idrec", 7));
  EXPECT_TRUE(yours.tryLock("idRec", 8));
  EXPECT_TRUE(yours.tryLock("idDel", 7));
  EXPECT_TRUE(yours.othersHold("idRec", 7));
  EXPECT_FALSE(mine.othersHold("idRec", 7));
  EXPECT_FALSE(yours.tryMark("idRec", 7));
  EXPECT_FALSE(yours.tryMark("idRec"));

  mine.release();
  EXPECT_TRUE(mine.empty());
  EXPECT_TRUE(yours.tryLock("idRec", 7));
  EXPECT_FALSE(mine.tryLock("idRec", -1) && yours.tryLock("idRec", -1));
}

TEST_F(RowLocksOfAFile, MarksStandBesideEachOtherAndAgainstClaims) {
  RowLocks mine(file_), yours(file_);
  EXPECT_TRUE(mine.tryLock("t", 1));
  EXPECT_TRUE(mine.tryMark("t", 1) && mine.tryMark("t", 2));
  EXPECT_FALSE(yours.tryMark("t", 1)) << "a mark lets no claim of its own session go";
  EXPECT_TRUE(yours.tryMark("t", 2) && mine.tryLock("t", 3));
  EXPECT_FALSE(yours.tryLock("t", 2));
  EXPECT_TRUE(yours.othersHold("t", 2));
  EXPECT_FALSE(mine.tryMark("t")) << "it would have to keep its claims, and another session has marks";
  yours.release();
  EXPECT_TRUE(mine.tryMark("t"));
  EXPECT_FALSE(yours.tryMark("t", 3) || yours.tryMark("t", 4));
  mine.release();

  for (std::int64_t row = 0; row <= static_cast<std::int64_t>(RowLocks::mostRows); ++row)
    ASSERT_TRUE(mine.tryMark("t", row));
  EXPECT_TRUE(yours.tryMark("t", 1'000'000));
  EXPECT_FALSE(yours.tryLock("t", 1'000'001));
}

TEST_F(RowLocksOfAFile, ManyRowsBecomeTheWholeTable) {
  RowLocks mine(file_), yours(file_);
  for (std::int64_t row = 0; row <= static_cast<std::int64_t>(RowLocks::mostRows); ++row)
    ASSERT_TRUE(mine.tryLock("users", row));
  EXPECT_FALSE(yours.tryLock("users", 1'000'000));
  EXPECT_TRUE(yours.tryLock("jobs", 1'000'000));
  mine.release();
  EXPECT_TRUE(yours.tryLock("users", 1'000'000));
  // The table cannot be had as a whole now; its free rows still can.
  for (std::int64_t row = 0; row < 1'500; ++row) ASSERT_TRUE(mine.tryLock("users", row));
  EXPECT_FALSE(mine.tryLock("users", 1'000'000));
}

}  // namespace
}  // namespace QVSa::embedded
