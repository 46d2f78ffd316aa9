#include <gtest/gtest.h>
#include <thread>

#include "QVSa/frame/ConnectionString.h"
#include "providers/embedded/session/Provider.h"
#include "providers/embedded/storage/Pool.h"
#include "tests/support/Failures.h"
#include "tests/support/TestInstallation.h"

namespace QVSa::test {

namespace {

// Two sessions on one small table.
class Sessions : public testing::Test {
 protected:
  Sessions() {
    first_->run(
        {"create table t (id int identity primary key, no nvarchar(20) not null unique, n int null, x image null, w "
         "ntext null)"});
    first_->run({"insert into t(no,n) values ('a',1), ('b',2), ('c',3)"});
  }

  std::unique_ptr<ProviderSession> open() {
    return embedded::provider().open(parseConnectionString(buildConnString(installation_.server(), "QVSys", false)));
  }

  static std::string all(ProviderSession& session, const std::string& text) {
    const auto result = session.run({text});
    return rest(*result.rows);
  }

  static std::string rest(Rows& rows) {
    std::string found;
    while (rows.next())
      found += (found.empty() ? "" : " ") + (rows.value(0).isNull() ? "NULL" : rows.value(0).toText());
    return found;
  }

  static Long nativeOf(ProviderSession& session, const std::string& text) {
    return thrownBy([&] { session.run({text, false, std::chrono::seconds(1)}); }).native();
  }

  static Long numberOf(ProviderSession& session, const std::string& text, int seconds = 1) {
    return failureOf([&] { session.run({text, false, std::chrono::seconds(seconds)}); });
  }

  TestInstallation installation_{TestInstallation::Content::empty};
  std::unique_ptr<ProviderSession> first_ = open();
  std::unique_ptr<ProviderSession> second_ = open();
};

const std::string claim = "select n from t with (rowlock xlock readpast) where no='a'";

}  // namespace

TEST_F(Sessions, ARowSetGoesOnFromMemoryWhenItsSessionWrites) {
  const auto atFirst = first_->run({"select no from t order by no"});
  const auto behind = first_->run({"select no from t order by no"});
  ASSERT_TRUE(atFirst.rows->next());
  ASSERT_TRUE(behind.rows->next() && behind.rows->next());
  first_->run({"delete from t"});
  EXPECT_EQ(atFirst.rows->value(0).toText(), "a");
  EXPECT_EQ(rest(*atFirst.rows), "b c");
  EXPECT_EQ(behind.rows->value(0).toText(), "b");
  EXPECT_EQ(rest(*behind.rows), "c");
  EXPECT_EQ(all(*first_, "select count(*) from t"), "0");
}

TEST_F(Sessions, ATransactionReadsWhatOthersHaveCommittedAndOthersSeeItsWorkAtItsEnd) {
  first_->begin();
  EXPECT_EQ(all(*first_, "select n from t where no='a'"), "1");
  second_->run({"update t set n=5 where no='a'"});
  EXPECT_EQ(all(*first_, "select n from t where no='a'"), "5");
  first_->run({"update t set n=n+1 where no='a'"});
  EXPECT_EQ(all(*second_, "select n from t where no='a'"), "5");
  first_->commit();
  EXPECT_EQ(all(*second_, "select n from t where no='a'"), "6");
}

TEST_F(Sessions, AFailedStatementLeavesTheTransactionAndASessionThatEndsTakesItBack) {
  first_->begin();
  first_->run({"insert into t(no) values ('d')"});
  EXPECT_EQ(numberOf(*first_, "insert into t(no) select 'e' union all select 'A'"), number::integrity);
  EXPECT_EQ(all(*first_, "select count(*) from t"), "4");
  first_.reset();
  EXPECT_EQ(all(*second_, "select count(*) from t"), "3");
}

TEST_F(Sessions, WrittenRowsAreCountedUnlessNocountIsOn) {
  EXPECT_EQ(first_->run({"update t set n=n where n>1"}).affected, 2);
  EXPECT_EQ(first_->run({"set nocount on update t set n=n"}).affected, -1);
  EXPECT_EQ(first_->run({"set nocount off update t set n=n"}).affected, 3);
}

TEST_F(Sessions, AClaimedRowIsPassedOverWaitedForOrRefused) {
  first_->begin();
  EXPECT_EQ(all(*first_, claim), "1");
  EXPECT_EQ(all(*second_, claim), "");
  EXPECT_EQ(numberOf(*second_, "select n from t with (xlock) where no='a'"), number::timeout);
  EXPECT_EQ(numberOf(*second_, "update t set n=0 where no='a'"), number::timeout);
  second_->run({"update t set n=0 where no='b'"});
  first_->commit();
  EXPECT_EQ(all(*second_, "select n from t with (xlock) where no='a'"), "1");
  EXPECT_EQ(all(*second_, "select n from t order by no"), "1 0 3");
}

TEST_F(Sessions, AnApplicationLockIsWaitedForAndEndsWithItsTransaction) {
  const std::string lock = "begin transaction exec sp_getapplock N'a','Exclusive'";
  first_->run({lock});
  EXPECT_EQ(numberOf(*second_, lock), number::timeout);
  second_->rollback();
  second_->run({"begin transaction exec sp_getapplock N'b','Exclusive' update t set n=0 where no='b'"});
  first_.reset();
  second_->run({"exec sp_getapplock N'a','Exclusive'", false, std::chrono::seconds(1)});
}

TEST_F(Sessions, AChangedRowIsPassedOverAndToInsertItsKeyCollidesAtOnce) {
  first_->begin();
  first_->run({"update t set n=5 where no='a'"});
  second_->begin();
  EXPECT_EQ(all(*second_, claim), "");
  EXPECT_EQ(nativeOf(*second_, "insert into t(no,n) values ('A ',1)"), 2627);
  EXPECT_EQ(all(*second_, "select n from t with (rowlock xlock readpast) where no='b'"), "2");
  EXPECT_EQ(numberOf(*second_, "insert into t(no,n) values ('d',1)"), number::timeout) << "another key waits";
  second_->rollback();
  first_->run({"delete from t"});
  EXPECT_EQ(all(*second_, "select n from t with (rowlock xlock readpast) where no='c'"), "");
  first_->rollback();
  EXPECT_EQ(all(*second_, claim), "1");
}

// The holder of the row may need the write lock before it lets the row go.
TEST_F(Sessions, AWriteThatMeetsAClaimedRowGivesTheWriteLockBackMeanwhile) {
  first_->begin();
  EXPECT_EQ(all(*first_, claim), "1");
  second_->begin();
  second_->run({"update t set n=9 where no='c'\ninsert into t(no,n) values ('d',4)"});
  std::thread other([&] { second_->run({"update t set n=n*10"}); });
  std::this_thread::sleep_for(std::chrono::milliseconds(100));
  first_->run({"update t set n=7 where no='a'"});
  EXPECT_EQ(all(*first_, "select n from t order by no"), "7 2 3");
  first_->commit();
  other.join();
  EXPECT_EQ(all(*second_, "select n from t order by no"), "70 20 90 40");
  second_->commit();
  EXPECT_EQ(all(*first_, "select n from t order by no"), "70 20 90 40");

  first_->begin();
  EXPECT_EQ(all(*first_, claim), "70");
  EXPECT_EQ(numberOf(*second_, "update t set n=1 where no>='a'"), number::timeout);
  EXPECT_EQ(numberOf(*second_, "delete from t"), number::timeout);
  second_->run({"update t set n=1 where no>'a'"});
  EXPECT_EQ(all(*first_, "select n from t order by no"), "70 1 1 1");
}

TEST_F(Sessions, ATransactionThatLostItsWritesTakesNothingButARollback) {
  const auto expectLost = [&] {
    for (const char* text :
         {"select n from t", "update t set n=0", "begin tran", "create table u (a int)", "use QVApp"})
      EXPECT_EQ(nativeOf(*second_, text), 3930) << text;
    EXPECT_EQ(thrownBy([&] { second_->commit(); }).native(), 3930);
    second_->run({"rollback tran select n from t"});
    EXPECT_EQ(all(*second_, "select n from t order by no"), "1 2 3");
  };
  first_->begin();
  EXPECT_EQ(all(*first_, claim), "1");
  second_->begin();
  second_->run({"update t set n=9 where no='c'"});
  EXPECT_EQ(all(*second_, "select n from t where no='c'"), "9");
  EXPECT_EQ(nativeOf(*second_, "update t set n=0 where no='a'"), 1205) << "what was seen can't be undone unseen";
  first_->run({"update t set n=3 where no='c'"});
  expectLost();
  first_->commit();

  first_->begin();
  EXPECT_EQ(all(*first_, claim), "1");
  second_->begin();
  second_->run({"update t set n=9 where no='c'"});
  EXPECT_EQ(numberOf(*second_, "update t set n=0 where no='a'"), number::timeout);
  expectLost();
  first_->commit();

  second_->begin();
  second_->run({"update t set n=9 where no='c'"});
  const std::string endless =
      "(select count(*) from t a,t b,t c,t d,t e,t f,t g,t h,t i,t j,t k,t l,t m,t o,t p,t q,t r)";
  EXPECT_EQ(numberOf(*second_, "update t set n=" + endless + " where no='a'"), number::timeout);
  expectLost();

  second_->begin();
  second_->run({"update t set n=9 where no='c'"});
  EXPECT_EQ(nativeOf(*second_, "update t set n='x' where no='a'"), 245);
  expectLost();

  second_->begin();
  EXPECT_EQ(numberOf(*second_, "update t set n=" + endless + " where no='a'"), number::timeout);
  second_->run({"update t set n=9 where no='c'"});
  second_->rollback();
  EXPECT_EQ(all(*second_, "select n from t order by no"), "1 2 3") << "nothing was lost, so nothing is refused";
}

TEST_F(Sessions, AFullDiskTakesTheTransactionWithIt) {
  first_.reset();
  second_.reset();
  embedded::acquireHandle(installation_.folder())->execute("pragma QVSys.max_page_count=30");
  second_ = open();
  second_->begin();
  second_->run({"update t set n=9 where no='c'"});
  EXPECT_EQ(nativeOf(*second_, "insert into t(no,w) values ('d','" + std::string(200000, 'y') + "')"), 1105);
  EXPECT_EQ(nativeOf(*second_, "update t set n=8 where no='b'"), 3930);
  EXPECT_EQ(thrownBy([&] { second_->commit(); }).native(), 3930);
  second_->rollback();
  EXPECT_EQ(all(*second_, "select n from t order by no"), "1 2 3");
}

TEST_F(Sessions, AWaitingWriteSeesWhatItWaitedFor) {
  first_->begin();
  EXPECT_EQ(all(*first_, claim), "1");
  std::thread other([&] { second_->run({"update t set n=n*10 where no='a'"}); });
  std::this_thread::sleep_for(std::chrono::milliseconds(100));
  first_->run({"update t set n=7 where no='a'"});
  first_->commit();
  other.join();
  EXPECT_EQ(all(*first_, "select n from t where no='a'"), "70");
}

TEST_F(Sessions, ALimitEndsARunningStatementAndNotAFetch) {
  const std::string large = "select a.n from t a,t b,t c,t d,t e,t f,t g,t h,t i,t j,t k,t l,t m,t o,t p,t q,t r";
  EXPECT_EQ(numberOf(*first_, "select count(*) from (" + large + ") as x"), number::timeout);
  const auto result = first_->run({large, false, std::chrono::seconds(1)});
  std::this_thread::sleep_for(std::chrono::milliseconds(1100));
  for (int i = 0; i < 10000; ++i) ASSERT_TRUE(result.rows->next());
}

TEST_F(Sessions, TheLogInsLimitIsNoneOfTheStatementsBehindIt) {
  ConnectionOptions options = parseConnectionString(buildConnString(installation_.server(), "QVSys", false));
  options.loginTimeout = std::chrono::seconds(1);
  const auto session = embedded::provider().open(options);
  std::this_thread::sleep_for(std::chrono::milliseconds(1100));
  const auto result = session->run({"select count(*) from t a,t b,t c,t d,t e,t f,t g,t h", false, {}});
  EXPECT_EQ(rest(*result.rows), "6561");
}

// b and c stand on each other: who asks for the way up from a must not be sent round there.
TEST_F(Sessions, AConditionOnWhatARecursionHandsOnIsAskedAtItsBeginning) {
  first_->run({"create table step (id int primary key, up int null)"});
  first_->run({"insert into step values (1,2),(2,3),(3,null),(8,9),(9,8)"});
  first_->run(
      {"create view way (start, at, hops) as with w (a, b, n) as (select id, id, 0 from step union all "
       "select w.a, s.up, w.n+1 from w inner join step s on s.id=w.b where s.up is not null) "
       "select a, b, n from w"});
  first_->run({"create view ups as select w.start, w.at, w.hops from way w inner join step s on s.id=w.at"});
  EXPECT_EQ(all(*first_, "select at from ups where start in (1,2) order by start, hops"), "1 2 3 2 3");
  EXPECT_EQ(all(*first_, "select u.at from ups u, step s where u.start='1' and u.hops>0 and s.id=u.at order by 1"),
            "2 3");
  // Not handed on unchanged, and so asked at the end: the ring is walked until the time is up.
  EXPECT_EQ(numberOf(*first_, "select start from ups where hops=2"), number::timeout);
  first_->run({"delete from step where id>3"});
  EXPECT_EQ(all(*first_, "select start from ups where hops=2"), "1");
  EXPECT_EQ(all(*first_,
                "select s.id from step s left join ups u on u.start=s.id and u.hops=0 "
                "where isnull(u.start,1)=1"),
            "1");
}

TEST_F(Sessions, WhatAnotherSessionDefinesIsKnownAtOnce) {
  EXPECT_EQ(numberOf(*second_, "select a from later"), number::noTable);
  first_->run({"create table later (a int)\ninsert into later values (4)"});
  EXPECT_EQ(all(*second_, "select a from later"), "4");
  first_->begin();
  first_->run({"create table never (a int)"});
  first_->rollback();
  EXPECT_EQ(numberOf(*first_, "select a from never"), number::noTable);
  first_->run({"create table never (b int)"});
  EXPECT_EQ(all(*first_, "select count(b) from never"), "0");
}

TEST_F(Sessions, RowsAreWrittenBackByTheirKeyAndComputedColumnsAreNot) {
  const auto result = first_->run({"select no,n,x,n+1 from t where n<3 order by no", true});
  second_->run({"delete from t where no='b' insert into t(no,n) values ('aa',1)"});
  ASSERT_TRUE(result.rows->next());
  const Bytes picture(300000, 0xFF);
  result.rows->update({{1, Variant(Long(41))}, {2, Variant(picture)}});
  EXPECT_EQ(failureOf([&] { result.rows->update({{3, Variant(Long(1))}}); }), number::readOnly);
  EXPECT_EQ(failureOf([&] { result.rows->update({{0, Variant("aa")}}); }), number::integrity);
  // The row set has the rows that it was opened with.
  ASSERT_TRUE(result.rows->next());
  EXPECT_EQ(result.rows->value(0).toText(), "b");
  EXPECT_EQ(failureOf([&] { result.rows->update({{1, Variant(Long(1))}}); }), number::general) << "it is gone";
  EXPECT_EQ(rest(*result.rows), "");
  const auto stored = second_->run({"select x from t where n=41"});
  ASSERT_TRUE(stored.rows->next());
  EXPECT_EQ(stored.rows->value(0).toBytes(), picture);
}

}  // namespace QVSa::test
