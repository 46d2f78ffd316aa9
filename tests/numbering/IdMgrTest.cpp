#include "tests/support/Scene.h"

namespace QVSa {
namespace {

using test::Lines;

class Numbers : public test::Scene {
 protected:
  void addRule(const String& name, Integer style, Integer width, Integer reuse = noReuse, const String& preFix = "N") {
    auto rule = connected<IdMgr>();
    rule.idName(name);
    rule.preFix(preFix);
    rule.DateFormat(style);
    rule.numPlace(width);
    rule.reuseStyle(reuse);
    ASSERT_TRUE(rule.Save()) << rule.errDescription();
  }
  IdMgr rule(const String& name) {
    auto result = connected<IdMgr>();
    EXPECT_TRUE(result.GetOne(name)) << result.errDescription();
    return result;
  }
  String issue(const String& name, Long startNo = -1) { return connected<IdMgr>().newId(name, "", startNo); }
  String issueFor(const String& record, const String& name) {
    return connected<IdMgr>().newId(name, "", -1, record, "session");
  }
  void release(const String& number) { tables_.run("update idDel set rcId=null where theId='" + number + "'"); }
  String counters(const String& name) const {
    return tables_.text("select ymd,maxId from idRec where idName='" + name + "' order by ymd");
  }
};

TEST_F(Numbers, BeginAnewWithThePeriodOfTheirDateStyle) {
  const std::pair<Integer, Lines> cases[] = {
      {noDate, {"N001", "N002", "N003", "N004"}},
      {yymm, {"N2403001", "N2403002", "N2404001", "N2501001"}},
      {yyyymm, {"N202403001", "N202403002", "N202404001", "N202501001"}},
      {yymmdd, {"N240307001", "N240308001", "N240401001", "N250102001"}},
      {yyyymmdd, {"N20240307001", "N20240308001", "N20240401001", "N20250102001"}},
      {yy, {"N24001", "N24002", "N24003", "N25001"}},
      {yyyy, {"N2024001", "N2024002", "N2024003", "N2025001"}},
  };
  for (const auto& [style, numbers] : cases) {
    const String name = "style" + text(style);
    addRule(name, style, 3);
    Lines issued;
    for (const Date day : {Date(2024, 3, 7, 23, 59, 59), Date(2024, 3, 8), Date(2024, 4, 1), Date(2025, 1, 2)}) {
      clock_.set(day);
      issued.push_back(issue(name));
    }
    EXPECT_EQ(issued, numbers);
  }
  EXPECT_EQ(counters("style" + text(yymm)),
            "2024-03-01 00:00:00|N2403002\n2024-04-01 00:00:00|N2404001\n2025-01-01 00:00:00|N2501001");
  EXPECT_EQ(counters("style" + text(yy)), "2024-01-01 00:00:00|N24003\n2025-01-01 00:00:00|N25001");
}

TEST_F(Numbers, ReleasedOnesComeBackWithinTheReachOfTheirRule) {
  const struct {
    Integer reuse;
    bool sameDay, nextDay, nextMonth, nextYear;
  } cases[] = {{noReuse, false, false, false, false},
               {sameDay, true, false, false, false},
               {sameMonth, true, true, false, false},
               {anyone, true, true, true, true}};
  const Date issued(2024, 3, 7, 10);
  for (const auto& [reuse, sameDay, nextDay, nextMonth, nextYear] : cases) {
    for (const auto& [day, back] : {std::pair(Date(2024, 3, 7, 23), sameDay), std::pair(Date(2024, 3, 8), nextDay),
                                    std::pair(Date(2024, 4, 7), nextMonth), std::pair(Date(2025, 3, 7), nextYear)}) {
      const String name = text(reuse) + " " + day.text();
      addRule(name, yyyymmdd, 2, reuse);
      clock_.set(issued);
      const String number = issueFor("r1", name);
      release(number);
      clock_.set(day);
      EXPECT_EQ(issueFor("r2", name) == number, back) << name;
    }
  }
}

TEST_F(Numbers, AReleasedOneComesBackAsItIsStoredAndIsThenHeldAgain) {
  addRule("inv", noDate, 3, anyone);
  for (const char* record : {"r1", "r2", "r3"}) issueFor(record, "inv");
  release("N003");
  tables_.run("update idDel set rcId='' where theId='N002'");
  EXPECT_EQ(connected<IdMgr>().InvalidNumbers("inv"),
            R"(<ns><n ymd="2024-03-07 00:00:00">N002</n><n ymd="2024-03-07 00:00:00">N003</n></ns>)");
  IdMgr changed = rule("inv");
  changed.preFix("M");
  changed.numPlace(5);
  EXPECT_TRUE(changed.Save());
  EXPECT_EQ(issueFor("r4", "INV"), "N002");
  EXPECT_EQ(issueFor("r5", "inv"), "N003");
  EXPECT_EQ(issueFor("r6", "inv"), "M00004");
  EXPECT_EQ(tables_.text("select theId,ymd,rcId,yy,mm,dd,sesId from idDel where rcId in ('r4','r6') order by rcId"),
            "N002|2024-03-07 00:00:00|r4|2024|3|7|session\nM00004|2024-03-07 00:00:00|r6|2024|3|7|session");
  EXPECT_EQ(connected<IdMgr>().InvalidNumbers("inv"), "");
}

TEST_F(Numbers, GoOnBehindTheWidthThatARuleWasGivenLater) {
  addRule("inv", yymm, 4, noReuse, "AB ");
  issue("inv", 12);
  clock_.set(Date(2024, 4, 1));
  EXPECT_EQ(issue("inv", 7), "AB24040007");
  IdMgr wide = rule("inv");
  wide.numPlace(6);
  EXPECT_TRUE(wide.Save());
  EXPECT_EQ(counters("inv"), "2024-03-01 00:00:00|AB2403000012\n2024-04-01 00:00:00|AB2404000007");
  EXPECT_EQ(issue("inv"), "AB2404000008");
  // The same object still compares with the width that it read.
  EXPECT_TRUE(wide.Save());
  EXPECT_EQ(counters("inv"), "2024-03-01 00:00:00|AB240300000012\n2024-04-01 00:00:00|AB240400000008");
}

TEST_F(Numbers, ARuleIsNarrowedOnlyBeforeItsFirstNumber) {
  addRule("inv", yymm, 4);
  IdMgr narrow = rule("inv");
  narrow.numPlace(3);
  EXPECT_TRUE(narrow.Save());
  issue("inv");
  narrow = rule("inv");
  narrow.numPlace(2);
  narrow.preFix("X");
  EXPECT_EQ(refusal(narrow, narrow.Save()), messageNumber(1508));
  EXPECT_EQ(narrow.errDescription(),
            "Error in saving sequential number.This number has been used, sequential number can be altered bigger, can "
            "not less.");
  EXPECT_EQ(tables_.text("select preFix,noStyle from idRule where idName='inv'"), "N|3");
}

TEST_F(Numbers, RunOutAtTheWidthOfTheRuleUntilItIsWidened) {
  addRule("inv", noDate, 1);
  EXPECT_EQ(issue("inv", 9), "N9");
  auto full = connected<IdMgr>();
  for (int i = 0; i < 2; ++i) {
    EXPECT_EQ(full.newId("inv"), "");
    EXPECT_EQ(full.errNumber(), messageNumber(1507));
    EXPECT_EQ(full.errDescription(),
              "Error in creating new table ID.Sequential number [inv] has  [1] digits, max number is [N9] currently, "
              "new number can not be generated. Please reset auto number settings to expand digits.");
  }
  IdMgr wide = rule("inv");
  wide.numPlace(2);
  EXPECT_TRUE(wide.Save());
  EXPECT_EQ(issue("inv"), "N10");

  addRule("none", noDate, 0);
  EXPECT_EQ(issue("none"), "");
  EXPECT_EQ(issue("none", 0), "N");
  EXPECT_EQ(full.newId("none"), "");
  EXPECT_EQ(full.errNumber(), number::type) << "its last number has no digits to go on from";
  tables_.run("update idRec set maxId='N1x' where idName='inv'");
  EXPECT_EQ(full.newId("inv"), "");
  EXPECT_EQ(full.errNumber(), number::type) << full.errDescription();
  wide.numPlace(10);
  EXPECT_TRUE(wide.Save());
  tables_.run("update idRec set maxId='2147483647' where idName='inv'");
  EXPECT_EQ(full.newId("inv"), "");
  EXPECT_EQ(full.errNumber(), number::overflow);
  EXPECT_EQ(full.newId(""), "") << "no rule is named";
  EXPECT_EQ(full.errNumber(), messageNumber(1501));
}

TEST_F(Numbers, ShowASampleOfEveryDateStyleByTheLocalClock) {
  IdMgr sample;
  sample.preFix("A ");
  sample.numPlace(4);
  const std::pair<Integer, const char*> expected[] = {
      {noDate, "A 0001"},           {yymm, "A 24030001"}, {yyyymm, "A 2024030001"}, {yymmdd, "A 2403070001"},
      {yyyymmdd, "A 202403070001"}, {yy, "A 240001"},     {yyyy, "A 20240001"},     {Integer{7}, "A 0001"}};
  for (const auto& [style, text] : expected) {
    sample.DateFormat(style);
    EXPECT_EQ(sample.GetSample(), text);
  }
  sample.numPlace(0);
  EXPECT_EQ(sample.GetSample(), "A 1");
}

TEST_F(Numbers, StartWhereTheyAreTold) {
  addRule("inv", yymm, 3);
  IdMgr told = rule("inv");
  EXPECT_TRUE(told.setStartNo(0));
  EXPECT_EQ(counters("inv"), "");
  EXPECT_TRUE(told.setStartNo(1));
  EXPECT_EQ(issue("inv"), "N2403001");
  EXPECT_TRUE(told.setStartNo(50));
  EXPECT_EQ(issue("inv"), "N2403050");
  EXPECT_EQ(issue("inv", 5), "N2403005");
  EXPECT_EQ(issue("inv"), "N2403006");
  EXPECT_TRUE(told.setStartNo(-3)) << "an ordinary issue";
  EXPECT_EQ(issue("inv"), "N2403008");
  EXPECT_EQ(refusal(told, told.setStartNo(1001)), messageNumber(1507));
}

TEST_F(Numbers, ANewStartForgetsWhatWasIssuedOnThePeriodsFirstDay) {
  addRule("inv", yymm, 3, anyone);
  clock_.set(Date(2024, 3, 1, 9));
  issueFor("first day", "inv");
  clock_.set(Date(2024, 3, 7, 9));
  issueFor("later", "inv");
  issue("inv", 10);
  EXPECT_EQ(tables_.text("select rcId from idDel where idName='inv'"), "later");
}

TEST_F(Numbers, TheRecordRuleIsDatedByDaysWhateverItsRowSays) {
  tables_.run("update idRule set preFix='x',ymdStyle=0 where idName='_RC'");
  EXPECT_EQ(issue("_RC"), "RC240307000001");
  EXPECT_EQ(issue("_rc"), "RC240307000002");
}

TEST_F(Numbers, OfARenamedRuleBeginAnewAndATakenNameIsRefused) {
  addRule("old", noDate, 3);
  addRule("taken", noDate, 3);
  issue("old");
  auto subject = connected<IdMgr>();
  EXPECT_EQ(refusal(subject, subject.Rename("old", "Taken")), number::integrity);
  EXPECT_EQ(subject.errDescription(), "Sequential number is duplicate.");
  EXPECT_TRUE(subject.Rename("old", "new"));
  EXPECT_EQ(issue("new"), "N001");
  EXPECT_EQ(issue("old"), "");
  EXPECT_EQ(refusal(subject, subject.Rename("old", "newer")), messageNumber(1502));

  auto rules = connected<IdMgrs>();
  EXPECT_TRUE(rules.GetAll());
  ASSERT_EQ(rules.Count(), 2) << "the rules of the system are left out";
  for (const auto& item : rules) {
    EXPECT_EQ(item->preFix(), "N");
    EXPECT_FALSE(item->Save()) << "it was never read";
    EXPECT_EQ(item->errDescription(), "Sequential number is duplicate.");
  }
  EXPECT_EQ(rules.Item(3), nullptr);
  EXPECT_TRUE(subject.Delete("new"));
  EXPECT_NE(counters("new"), "") << "counters stay";
}

TEST_F(Numbers, RulesAreListedTrimmedAndEachTimeAnew) {
  tables_.run("insert into idRule(idName,preFix,nws) values(' inv ',' P ',2)");
  IdMgrs rules;
  rules.gsDBConnString(connected<IdMgrs>().gsDBConnString());
  EXPECT_EQ(rules.gsDBConnString(), buildConnString(server(), "QVApp", false));
  EXPECT_TRUE(rules.GetAll());
  EXPECT_TRUE(rules.GetAll());
  ASSERT_EQ(rules.Count(), 1);
  EXPECT_EQ(rules.Item(1)->idName() + "|" + rules.Item(1)->preFix(), "inv|P");
  EXPECT_TRUE(rules.Item(1)->whenSave());

  IdMgr read = rule(" inv");
  EXPECT_FALSE(read.whenSave());
  EXPECT_TRUE(read.Delete());
  EXPECT_TRUE(rules.GetAll());
  EXPECT_EQ(rules.Count(), 0);
}

}  // namespace
}  // namespace QVSa
