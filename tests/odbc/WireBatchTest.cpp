#include <gtest/gtest.h>

#include "QVSa/values/Failure.h"
#include "providers/odbc/WireBatch.h"

namespace QVSa::odbc {
namespace {

TEST(WireBatch, GoesOutAsItStandsWhereItMay) {
  for (const String batch : {"  select 'a*=b'  --  x\n", "update t set n=n*2 where a=b", "select [备注] from t --é",
                             "backup database x to disk=N'é'", "select a /* b *= c */ from t", "what 'is this"}) {
    EXPECT_EQ(wireBatch(batch).text, batch);
  }
}

TEST(WireBatch, HasAnNBeforeEveryLiteralBeyondAscii) {
  EXPECT_EQ(wireBatch("insert into t(a) values('备注','b',N'é','it''s é') what 'ü'").text,
            "insert into t(a) values(N'备注','b',N'é',N'it''s é') what N'ü'");
  EXPECT_EQ(wireBatch("delete from t where a in ('b','é', 'ü')").text, "delete from t where a in ('b',N'é', N'ü')");
  EXPECT_NE(wireBatch("select a from t x,u y where x.a*=y.b and y.c='é'").text.find("N'é'"), String::npos);
}

TEST(WireBatch, HasLeftJoinsInPlaceOfOldOnes) {
  const String text =
      wireBatch("set nocount on select l.msg,rt.name from sysLog l,repTmps rt where l.rtId*=rt.rtUid").text;
  EXPECT_EQ(text.find("*="), String::npos);
  EXPECT_NE(text.find("left"), String::npos);
  EXPECT_LT(text.find("nocount"), text.find("left"));
  EXPECT_EQ(wireBatch(text).text, text);
}

TEST(WireBatch, IsRefusedWithAnOldJoinThatItCannotRewrite) {
  EXPECT_THROW(wireBatch("select a from t x,u y where x.a*=z.b"), Failure);
  EXPECT_THROW(wireBatch("selec a from t x,u y where x.a*=y.b"), Failure);
}

TEST(WireBatch, IsKnownByItsStatements) {
  struct Known {
    const char* batch;
    bool endsWithItsRowSet, canFollow, leavesNoTrace;
  };
  for (const Known& known : {Known{"select a from t order by a", true, true, true},
                             {"set nocount on insert into t values(1) select a from t", true, true, true},
                             {"select a from t delete from t", false, true, true},
                             {"select a from t select b from t", false, true, true},
                             {"begin transaction exec sp_getapplock 'x','Exclusive'", false, true, true},
                             {"sp_getapplock 'x','Exclusive'", false, false, true},
                             {"sp_changedbowner 'x'", false, false, false},
                             {"set identity_insert t on", false, false, false},
                             {"create table #t(a int)", false, false, false},
                             {"what is this", false, false, false}}) {
    const WireBatch batch = wireBatch(known.batch);
    EXPECT_EQ(batch.endsWithItsRowSet, known.endsWithItsRowSet) << known.batch;
    EXPECT_EQ(batch.canFollow, known.canFollow) << known.batch;
    EXPECT_EQ(batch.leavesNoTrace, known.leavesNoTrace) << known.batch;
  }
  EXPECT_TRUE(wireBatch("set nocount on").isNocount);
  EXPECT_TRUE(wireBatch("alter database QVSys set SINGLE_USER").wantsDatabaseAlone);
}

}  // namespace
}  // namespace QVSa::odbc
