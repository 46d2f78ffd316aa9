#include <gtest/gtest.h>

#include "QVSa/values/Failure.h"
#include "providers/odbc/WireText.h"

namespace QVSa::odbc {
namespace {

TEST(WireText, SendsABatchWithoutOldJoinsAsItStands) {
  for (const String batch : {"  select 'a*=b'  --  x\n", "update t set n=n*2 where a=b",
                             "backup database x to disk='y'", "select a /* b *= c */ from t"}) {
    EXPECT_EQ(wireText(batch), batch);
  }
}

TEST(WireText, PutsLeftJoinsInPlaceOfOldOnes) {
  const String text = wireText("set nocount on select l.msg,rt.name from sysLog l,repTmps rt where l.rtId*=rt.rtUid");
  EXPECT_EQ(text.find("*="), String::npos);
  EXPECT_NE(text.find("left"), String::npos);
  EXPECT_LT(text.find("nocount"), text.find("left"));
  EXPECT_EQ(wireText(text), text);
}

TEST(WireText, DoesNotSendAnOldJoinThatItCannotRewrite) {
  EXPECT_THROW(wireText("select a from t x,u y where x.a*=z.b"), Failure);
  EXPECT_THROW(wireText("selec a from t x,u y where x.a*=y.b"), Failure);
}

TEST(WireText, KnowsWhetherRowsAreTheLastOfABatch) {
  EXPECT_TRUE(endsWithItsRowSet("select a from t order by a"));
  EXPECT_TRUE(endsWithItsRowSet("set nocount on insert into t values(1) select a from t"));
  EXPECT_FALSE(endsWithItsRowSet("select a from t delete from t"));
  EXPECT_FALSE(endsWithItsRowSet("select a from t select b from t"));
  EXPECT_FALSE(endsWithItsRowSet("exec p select b from t"));
  EXPECT_FALSE(endsWithItsRowSet("what is this"));
}

}  // namespace
}  // namespace QVSa::odbc
