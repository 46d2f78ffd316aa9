#include <gtest/gtest.h>
#include <thread>
#include <vector>

#include "providers/embedded/administration/Login.h"
#include "providers/embedded/storage/Pool.h"
#include "tests/embedded/ChildProcess.h"
#include "tests/embedded/InstallationFolder.h"

namespace QVSa::embedded {
namespace {

template <class Action>
Failure failureOf(Action action) {
  try {
    action();
  } catch (const Failure& failure) {
    return failure;
  }
  return Failure(0, "", "nothing failed");
}

TEST(Pool, AWarmHandleComesBackWithoutWhatTheLastSessionLeft) {
  InstallationFolder folder;
  sqlite3* warm = nullptr;
  {
    PooledHandle handle = acquireHandle(folder.data());
    warm = handle->get();
    handle->attachment() = std::make_shared<int>(42);
    handle->deadline(std::chrono::steady_clock::now());
    handle->context().hasScopeIdentity = true;
    handle->locks(1).tryLock("t", 1);
    handle->deadline(std::nullopt);
    handle->execute("begin; create table QVSys.t(x); insert into QVSys.t values(1),(2)");
    Prepared open(handle->get(), "select x from QVSys.t");
    ASSERT_TRUE(open.step());
    // Given back in the middle of everything, as after an exception.
    handle.reset();
    PooledHandle again = acquireHandle(folder.data());
    EXPECT_EQ(again->get(), warm);
    EXPECT_FALSE(again->inTransaction());
    EXPECT_FALSE(again->deadline().has_value());
    EXPECT_FALSE(again->context().hasScopeIdentity);
    EXPECT_TRUE(again->locks(1).empty());
    EXPECT_EQ(*std::static_pointer_cast<int>(again->attachment()), 42);
    EXPECT_THROW(Prepared(again->get(), "select * from QVSys.t"), Failure);
  }
}

TEST(Pool, AFileThatAnotherOneHasReplacedIsNoticedWhicheverItIs) {
  InstallationFolder folder;
  const auto replace = [&](const char* name) {
    const auto file = databaseFile(folder.data(), name);
    std::filesystem::copy_file(file, folder.root() / "copy");
    std::filesystem::rename(folder.root() / "copy", file);
  };
  for (const char* name : databaseNames) {
    acquireHandle(folder.data())->attachment() = std::make_shared<int>();
    EXPECT_TRUE(acquireHandle(folder.data())->attachment());
    replace(name);
    const PooledHandle open = acquireHandle(folder.data());
    EXPECT_FALSE(open->attachment()) << name;
    replace(name);
    EXPECT_EQ(failureOf([&] { open->catalogueVersion(); }).native(), 4060) << name;
  }
}

TEST(Pool, AForkedProcessIsRefusedAndHarmsNothing) {
  InstallationFolder folder;
  PooledHandle handle = acquireHandle(folder.data());
  handle->execute("create table QVSys.t(x); begin; insert into QVSys.t values(1)");
  handle->locks(1).tryLock("t", 1);
  ChildProcess child([&] {
    const bool refused = failureOf([&] { acquireHandle(folder.data()); }).number() == number::general &&
                         failureOf([&] { handle->requireOwnProcess(); }).number() == number::general;
    handle.reset();
    return refused ? 0 : 1;
  });
  EXPECT_EQ(child.exitCode(), 0);
  RowLocks others(lockFile(folder.data(), "QVSys"));
  EXPECT_FALSE(others.tryLock("t", 1));
  handle->requireOwnProcess();
  handle->execute("commit");
}

TEST(Login, ThePasswordHasToBeRightEachTime) {
  InstallationFolder folder;
  const PooledHandle handle = acquireHandle(folder.data());
  for (int i = 0; i < 2; ++i) {
    EXPECT_NO_THROW(checkLogin(*handle, "qvuser ", "user-password"));
    EXPECT_NO_THROW(checkLogin(*handle, "sa", "sa-password"));
    for (const auto& [user, password] :
         {std::pair("sa", "user-password"), std::pair("sa", ""), std::pair("nobody", "x"), std::pair("nobody", "")}) {
      const Failure failure = failureOf([&, name = user, word = password] { checkLogin(*handle, name, word); });
      EXPECT_EQ(failure.native(), 18456);
      EXPECT_EQ(failure.number(), number::login);
      EXPECT_EQ(failure.description(), "Login failed for user '" + std::string(user) + "'.");
    }
  }
  // A password that was right is not right any more once it was changed.
  {
    const CatalogueChange change(handle->mark());
    handle->execute(
        "update master.logins set digest=(select digest from master.logins where name='QVUser') where name='sa'");
  }
  EXPECT_EQ(failureOf([&] { checkLogin(*handle, "sa", "sa-password"); }).native(), 18456);
}

}  // namespace
}  // namespace QVSa::embedded
