#include <gtest/gtest.h>

#include "QVSa/frame/ConnectionString.h"
#include "QVSa/numbering/IdMgr.h"
#include "QVSa/resources/Messages.h"
#include "platform/Services.h"
#include "tests/support/FakeSession.h"

namespace QVSa {
namespace {

using test::FakeServer;
using Log = std::vector<String>;

const char* const readRule =
    "select preFix,ymdStyle,noStyle,reuseStyle,ymd=getdate() from idRule where idName=N'invoice'";
const char* const readMonth =
    "select maxId=max(maxId) from idRec  with (rowlock xlock readpast) where idName=N'invoice'"
    " and ymd>='20240301 00:00:00' and ymd<'20240401 00:00:00'";
const char* const readReleased =
    "select min(theId) from idDel where idName=N'invoice' and (rcId is null or rcId='') and yy=2024 and mm=3";

// A server whose rule `invoice` is AB, yymm, width 4, reuse in the month; it is 7 March 2024 there.
class IdMgrIssuing : public ::testing::Test {
 protected:
  IdMgrIssuing() {
    rule_.connect("host", "QVApp");
    answerRule(4);
    answerLast("AB24030012");
    answerReleased(Variant::null());
  }

  void answerRule(Integer width) {
    server_.answer(readRule, {{{"preFix"}, {"ymdStyle"}, {"noStyle"}, {"reuseStyle"}, {"ymd"}},
                              {{" AB ", Integer{yymm}, width, Integer{sameMonth}, Date(2024, 3, 7, 14, 5, 9)}}});
  }
  void answerLast(const Variant& maxId) { server_.answer(readMonth, {{{"maxId"}}, {{maxId}}}); }
  void answerReleased(const Variant& theId) { server_.answer(readReleased, {{{""}}, {{theId}}}); }

  FakeServer server_;
  IdMgr rule_;
};

TEST_F(IdMgrIssuing, TheNextNumberFollowsTheLastOneUnderTheRowsLock) {
  EXPECT_EQ(rule_.newId("invoice"), "AB24030013");
  EXPECT_EQ(server_.log,
            (Log{"open", "set nocount on", readRule, "begin", readMonth,
                 "update idRec set maxId=N'AB24030013' where idName=N'invoice' and ymd='20240301 00:00:00'", "commit",
                 "close"}));
  EXPECT_EQ(server_.lastOptions.database, "QVApp");

  IdMgr unconnected;
  for (IdMgr* rule : {&unconnected, &rule_}) {
    server_.lastOptions = {};
    EXPECT_EQ(rule->newId("invoice", buildConnString("other", "QVSys", false)), "AB24030013");
    EXPECT_EQ(server_.lastOptions.dataSource + "/" + server_.lastOptions.database, "other/QVSys");
  }
}

TEST_F(IdMgrIssuing, APeriodBeginsWithOneAndStoresItsFirstDay) {
  answerLast(Variant::null());
  rule_.idName("invoice");
  EXPECT_EQ(rule_.newId(""), "AB24030001");
  EXPECT_EQ(server_.log[5],
            "insert into idRec(idName,ymd,maxId) values (N'invoice','20240301 00:00:00',N'AB24030001')");
}

TEST_F(IdMgrIssuing, ARecordsNumberIsBookedOnTheDayOfIssue) {
  EXPECT_EQ(rule_.newId("invoice", "", -1, "r1", "s1"), "AB24030013");
  EXPECT_EQ(server_.log[7], "commit");
  EXPECT_EQ(server_.log[8],
            "insert into idDel(idName,theId,ymd,rcId,yy,mm,dd,sesId) values"
            "(N'invoice',N'AB24030013','20240307 00:00:00',N'r1',2024,3,7,N's1')");
}

TEST_F(IdMgrIssuing, AReleasedNumberComesBackAsItStandsWithoutATransaction) {
  answerReleased("OLD7");
  EXPECT_EQ(rule_.newId("invoice", "", -1, "r1", "s1"), "OLD7");
  EXPECT_EQ(server_.log,
            (Log{"open", "set nocount on", readRule, readReleased,
                 "update idDel set rcId=N'r1',sesId=N's1' where idName=N'invoice' and theId=N'OLD7'", "close"}));
}

TEST_F(IdMgrIssuing, AStartNumberIsUsedAsItStandsAndForgetsWhatWasReleasedOnTheFirstDay) {
  EXPECT_EQ(rule_.newId("invoice", "", 5), "AB24030005");
  EXPECT_EQ(server_.log[7], "delete from idDel where idName=N'invoice' and ymd='20240301 00:00:00'");

  rule_.idName("invoice");
  EXPECT_TRUE(rule_.setStartNo(1));
  EXPECT_EQ(server_.log[14],
            "update idRec set maxId=N'AB24030000' where idName=N'invoice' and ymd='20240301 00:00:00'");
  server_.log.clear();
  EXPECT_TRUE(rule_.setStartNo(0));
  EXPECT_TRUE(server_.log.empty());
}

TEST_F(IdMgrIssuing, AnExceededWidthRollsBackAndTellsBothMessages) {
  answerLast("AB24039999");
  EXPECT_EQ(rule_.newId("invoice"), "");
  EXPECT_EQ(rule_.errNumber(), messageNumber(1507));
  EXPECT_EQ(rule_.errDescription(), LoadResString(1503) + fillMsg(LoadResString(1507), {"invoice", 4, "AB24039999"}));
  EXPECT_EQ(server_.log.back(), "close");
  EXPECT_EQ(std::count(server_.log.begin(), server_.log.end(), "commit"), 0);
}

TEST_F(IdMgrIssuing, ALastNumberThatIsNoneFails) {
  answerLast("AB2403x012");
  EXPECT_EQ(rule_.newId("invoice"), "");
  EXPECT_EQ(rule_.errNumber(), number::type);

  answerRule(10);
  answerLast("2147483647");
  EXPECT_EQ(rule_.newId("invoice"), "");
  EXPECT_EQ(rule_.errNumber(), number::overflow);
}

TEST_F(IdMgrIssuing, ACollisionIsAFailedCallAndAFailureBehindTheCommitConsumesTheNumber) {
  answerLast(Variant::null());
  server_.fail("insert into idRec(idName,ymd,maxId) values (N'invoice','20240301 00:00:00',N'AB24030001')",
               Failure(number::integrity, "server", "key."));
  EXPECT_EQ(rule_.newId("invoice"), "");
  EXPECT_EQ(rule_.errNumber(), number::integrity);
  EXPECT_EQ(rule_.errDescription(), LoadResString(1503) + "key.");

  answerLast("AB24030012");
  server_.log.clear();
  server_.fail("delete from idDel where idName=N'invoice' and ymd='20240301 00:00:00'",
               Failure(number::timeout, "server", "late."));
  EXPECT_EQ(rule_.newId("invoice", "", 7), "");
  EXPECT_EQ(server_.log[6], "commit");
}

TEST_F(IdMgrIssuing, WithoutANameNothingIsOpenedAndWithoutARuleNothingIsChanged) {
  EXPECT_EQ(rule_.newId(""), "");
  EXPECT_EQ(rule_.errNumber(), messageNumber(1501));
  EXPECT_TRUE(server_.log.empty());

  server_.answer("select preFix,ymdStyle,noStyle,reuseStyle,ymd=getdate() from idRule where idName=N'none'",
                 {{{"preFix"}}, {}});
  EXPECT_EQ(rule_.newId("none"), "");
  EXPECT_EQ(rule_.errNumber(), messageNumber(1502));
  EXPECT_EQ(rule_.errDescription(), LoadResString(1502));
}

TEST(IdMgr, ASampleShowsEveryDateStyleByTheLocalClockAndKeepsThePrefixesBlanks) {
  platform::Services services = platform::services();
  services.localTime = [] { return Date(2024, 3, 7, 23, 59, 59); };
  platform::Services before = platform::replaceServices(services);
  IdMgr rule;
  rule.preFix("A ");
  rule.numPlace(4);
  const std::pair<Integer, const char*> expected[] = {
      {noDate, "A 0001"},           {yymm, "A 24030001"}, {yyyymm, "A 2024030001"}, {yymmdd, "A 2403070001"},
      {yyyymmdd, "A 202403070001"}, {yy, "A 240001"},     {yyyy, "A 20240001"},     {Integer{7}, "A 0001"}};
  for (const auto& [style, sample] : expected) {
    rule.DateFormat(style);
    EXPECT_EQ(rule.GetSample(), sample);
  }
  rule.numPlace(0);
  EXPECT_EQ(rule.GetSample(), "A 1");
  platform::replaceServices(std::move(before));
}

class IdMgrSaving : public ::testing::Test {
 protected:
  IdMgrSaving() {
    server_.answer("select * from idRule where idName=N'old'",
                   {{{"idName"}, {"preFix"}, {"ymdStyle"}, {"noStyle"}, {"reuseStyle"}, {"nws"}},
                    {{"OLD", " AB ", Integer{yymm}, Integer{4}, Integer{anyone}, Integer{2}}}});
    server_.answer("select idName from idRule where idName=N'old'", {{{"idName"}}, {{"OLD"}}});
    server_.answer("select idName from idRule where idName=''", {{{"idName"}}, {}});
    rule_.connect("host", "QVApp");
  }

  FakeServer server_;
  IdMgr rule_;
};

TEST_F(IdMgrSaving, AGrownWidthWidensTheStoredNumbersFromTheWidthThatWasRead) {
  ASSERT_TRUE(rule_.GetOne("old"));
  EXPECT_FALSE(rule_.whenSave()) << "only 1 means yes";
  rule_.numPlace(6);
  server_.log.clear();
  EXPECT_TRUE(rule_.Save());
  EXPECT_EQ(server_.log,
            (Log{"open", "set nocount on", "begin", "select idName from idRule where idName=N'old'",
                 "Update idRule set IdName=N'old',preFix=N'AB',ymdstyle=1,noStyle=6,reuseStyle=3,nws=2"
                 " where idname=N'old'",
                 "update idRec set maxId= substring(maxId,1,len(maxId)-4)+'00'+substring(maxId,len(maxId)-4+1,"
                 "len(maxId)) where idName=N'old'",
                 "commit", "close"}));
}

TEST_F(IdMgrSaving, ATakenNameIsToldAlone) {
  const String insert =
      "insert into idRule(idName,preFix,ymdStyle,noStyle,reuseStyle,nws) values(N'old',N'AB',1,4,0,1)";
  rule_.idName("old");
  rule_.preFix("AB");
  rule_.DateFormat(yymm);
  rule_.numPlace(4);
  rule_.whenSave(true);
  server_.fail(insert, Failure(number::integrity, "server", "key."));
  EXPECT_FALSE(rule_.Save());
  EXPECT_EQ(rule_.errNumber(), number::integrity);
  EXPECT_EQ(rule_.errDescription(), LoadResString(1506));

  server_.fail(insert, Failure(number::timeout, "server", "late."));
  EXPECT_FALSE(rule_.Save());
  EXPECT_EQ(rule_.errDescription(), LoadResString(1505) + "late.");
}

TEST_F(IdMgrSaving, ReleasedNumbersComeAsXmlAndAFailureAsAWordWithoutAReport) {
  const String released = "select theId,ymd from idDel where idName=N'old' and (rcid is null or rcId='')";
  server_.answer(released, {{{"theId"}, {"ymd"}}, {{"A<1", Date(2024, 3, 7)}, {"A2", Date(2024, 3, 8)}}});
  EXPECT_EQ(rule_.InvalidNumbers("old"),
            R"(<ns><n ymd="2024-03-07 00:00:00">A&lt;1</n><n ymd="2024-03-08 00:00:00">A2</n></ns>)");
  server_.answer(released, {{{"theId"}, {"ymd"}}, {}});
  rule_.idName("old");
  EXPECT_EQ(rule_.InvalidNumbers(), "");
  server_.fail(released, Failure(number::timeout, "server", "late."));
  EXPECT_EQ(rule_.InvalidNumbers(), "fail");
  EXPECT_EQ(rule_.errNumber(), 0);
}

}  // namespace
}  // namespace QVSa
