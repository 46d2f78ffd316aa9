#include "tests/support/RecordingProvider.h"
#include "tests/support/Scene.h"

namespace QVSa::test {
namespace {

// Two callers of one rule, the second of which runs from begin to end while the first stands before a statement.
class TwoCallers : public Scene {
 protected:
  void addRule(Integer style, Integer reuse = noReuse) {
    auto rule = connected<IdMgr>();
    rule.idName("inv");
    rule.DateFormat(style);
    rule.numPlace(2);
    rule.reuseStyle(reuse);
    ASSERT_TRUE(rule.Save()) << rule.errDescription();
  }
  void issueTogether(const String& statement, const String& record = "") {
    first_ = connected<IdMgr>();
    second_ = connected<IdMgr>();
    RecordingProvider recorder;
    bool met = false;
    recorder.beforeEach([&](const String& event) {
      if (met || event.rfind(statement, 0) != 0) return;
      met = true;
      secondNumber_ = second_.newId("inv", "", -1, record.empty() ? "" : record + "2", "");
    });
    firstNumber_ = first_.newId("inv", "", -1, record.empty() ? "" : record + "1", "");
    EXPECT_TRUE(met);
  }
  static void expectCollision(const IdMgr& caller, const String& number) {
    EXPECT_EQ(number, "");
    EXPECT_EQ(caller.errNumber(), number::integrity);
    EXPECT_EQ(caller.errDescription().rfind("Error in creating new table ID.", 0), 0U) << caller.errDescription();
  }

  IdMgr first_, second_;
  String firstNumber_, secondNumber_;
};

TEST_F(TwoCallers, OfADatedRuleNeverGetTheSameNumber) {
  addRule(yymmdd);
  issueTogether("insert into idRec");
  EXPECT_EQ(secondNumber_, "24030701");
  expectCollision(first_, firstNumber_);
  issueTogether("update idRec");
  EXPECT_EQ(firstNumber_, "24030702");
  expectCollision(second_, secondNumber_);
}

TEST_F(TwoCallers, OfARuleWithoutADateGetAnOldNumberAgainOnALaterDay) {
  addRule(noDate);
  for (const char* number : {"01", "02"}) EXPECT_EQ(connected<IdMgr>().newId("inv"), number);
  issueTogether("update idRec");
  expectCollision(second_, secondNumber_);
  EXPECT_EQ(firstNumber_, "03") << "on the day of the first number the key still tells them apart";

  // The row keeps the day of the first number, so that on another day nothing refuses a second row.
  clock_.set(Date(2024, 3, 8));
  issueTogether("update idRec");
  EXPECT_EQ(secondNumber_, "01");
  EXPECT_EQ(firstNumber_, "04");
  EXPECT_EQ(tables_.text("select ymd,maxId from idRec order by ymd"), "2024-03-07 00:00:00|04\n2024-03-08 00:00:00|04");
  EXPECT_EQ(connected<IdMgr>().newId("inv"), "05") << "both rows go on together";
}

TEST_F(TwoCallers, WhoReuseCanGetTheSameReleasedNumber) {
  addRule(yymmdd, anyone);
  EXPECT_EQ(connected<IdMgr>().newId("inv", "", -1, "record", ""), "24030701");
  tables_.run("update idDel set rcId=null");
  issueTogether("update idDel", "record");
  EXPECT_EQ(firstNumber_, "24030701");
  EXPECT_EQ(secondNumber_, "24030701");
  EXPECT_EQ(tables_.text("select theId,rcId from idDel"), "24030701|record1") << "the later writer holds it";
}

}  // namespace
}  // namespace QVSa::test
