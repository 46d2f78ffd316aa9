#include "QVSa/classification/Directory.h"
#include "QVSa/resources/Messages.h"
#include "tests/support/EnvironmentLocale.h"
#include "tests/support/Scene.h"

namespace QVSa {
namespace {

class ReportClasses : public test::Scene {
 protected:
  Directory node() const {
    Directory made;
    made.connect(server(), "QVApp");
    return made;
  }
  Directory loaded(const String& name) const {
    Directory made = node();
    EXPECT_TRUE(made.GetOne(0, name));
    return made;
  }
  bool add(const String& name, const String& superClass = "") {
    Directory made = node();
    made.Class(name);
    made.superClass(superClass);
    return made.Save();
  }
  // The three texts of a row.
  String row(const String& name) const {
    return tables_.text("select path,fullName,ordNo,ordPath from RptDirectory where class='" + name + "'");
  }
  // Names in the order of the tree's listing.
  String listed(const String& superior = "") const {
    const String xml = node().GetAll(superior);
    String names;
    for (std::size_t at = 0; (at = xml.find("</d>", at)) != String::npos; ++at) {
      const std::size_t from = xml.rfind('>', at) + 1;
      names += xml.substr(from, at - from) + " ";
    }
    return names;
  }

  test::EnvironmentLocale locale_{"C"};
};

TEST_F(ReportClasses, TakeTheirPlaceBehindTheirSiblings) {
  ASSERT_TRUE(add("A"));
  EXPECT_EQ(row("A"), ".A.|A|1|001");
  add("B");
  ASSERT_TRUE(add("C", "A"));
  ASSERT_TRUE(add("D", "A"));
  EXPECT_EQ(row("D"), ".A.D.|A,D|2|001.002");

  Directory taken = node();
  taken.Class("a");
  EXPECT_EQ(refusal(taken, taken.Save()), number::integrity);
  taken.Class("E");
  taken.superClass("gone");
  EXPECT_EQ(refusal(taken, taken.Save()), static_cast<Long>(0x80040578));
  EXPECT_EQ(taken.errDescription(), "Classification [gone] does not exist.");
}

TEST_F(ReportClasses, HaveNoPlaceBelowOneWithoutAPlace) {
  tables_.run("insert into RptDirectory(class) values('Bare')");
  ASSERT_TRUE(add("X", "Bare"));
  EXPECT_EQ(row("X"), ".X.|X|-|-");
}

TEST_F(ReportClasses, ComeBackAsTheyWereSaved) {
  Directory made = node();
  made.Class("O'Brien");
  made.fullName("not used");
  made.creUserId(4);
  made.creUserName("Ann");
  made.createTime(Date(2024, 3, 7, 14, 5, 9));
  made.updUserId(5);
  made.upduserName("Bob");
  made.updTime(Date(2024, 3, 8));
  made.otherCanDesign(true);
  ASSERT_TRUE(made.Save()) << made.errDescription();
  EXPECT_EQ(made.fullName(), "O'Brien");

  Directory read = loaded("o'brien");
  EXPECT_EQ(read.Class() + read.superClass() + read.ordPath() + read.creUserName() + read.upduserName(),
            "O'Brien001AnnBob");
  EXPECT_EQ(read.creUserId() * 10 + read.updUserId(), 45);
  EXPECT_EQ(read.createTime().text() + read.updTime().text(), "2024-03-07 14:05:092024-03-08 00:00:00");
  EXPECT_TRUE(read.otherCanDesign());
  EXPECT_EQ(read.ordNo(), 1);
  EXPECT_TRUE(read.GetOne(1, "gone"));
  EXPECT_EQ(read.Class(), "O'Brien");
  EXPECT_EQ(read.errNumber(), 0);
}

TEST_F(ReportClasses, RenameTheirBranchByWholeNames) {
  add("A");
  add("AA", "A");
  add("B", "AA");
  Directory a = loaded("A");
  a.Class("X");
  ASSERT_TRUE(a.Save()) << a.errDescription();
  EXPECT_EQ(row("AA"), ".X.AA.|X,AA|1|001.001");
  EXPECT_EQ(row("B"), ".X.AA.B.|X,AA,B|1|001.001.001");
  EXPECT_EQ(tables_.text("select superClass from RptDirectory where class='AA'"), "A") << "the name above stays";
  EXPECT_EQ(a.fullName(), "X");

  Directory b = loaded("B");
  tables_.run("delete from RptDirectory where class='B'");
  b.superClass("");
  EXPECT_FALSE(b.Save());
  EXPECT_EQ(b.errDescription(), "Classification [B] does not exist.");
  b.superClass("AA");
  EXPECT_TRUE(b.Save()) << "no change: nothing is looked for";
}

TEST_F(ReportClasses, MoveWithWhatLiesBelowAndBack) {
  for (const char* name : {"P", "Q"}) add(name);
  add("N", "P");
  add("K", "N");
  Directory n = loaded("N");
  n.superClass("Q");
  ASSERT_TRUE(n.Save()) << n.errDescription();
  EXPECT_EQ(row("K"), ".Q.N.K.|Q,N,K|1|002.001.001");
  n.superClass("P");
  ASSERT_TRUE(n.Save()) << n.errDescription();
  EXPECT_EQ(row("K"), ".P.N.K.|P,N,K|1|001.001.001");
}

TEST_F(ReportClasses, GoToTheEndWithEverySaveAndTheRestMovesUp) {
  for (const char* name : {"A", "B", "C"}) add(name);
  add("A1", "A");
  Directory a = loaded("A");
  ASSERT_TRUE(a.Save());
  EXPECT_EQ(row("A"), ".A.|A|3|003");
  EXPECT_EQ(row("A1"), ".A.A1.|A,A1|1|004.001") << "as it was before the gap was closed";
  EXPECT_EQ(row("B"), ".B.|B|1|001");
  EXPECT_EQ(listed(), "B C A A1 ");
  EXPECT_TRUE(node().updateSubOrder("", "C,A,B"));
  EXPECT_EQ(listed(), "C A B A1 ");
  EXPECT_TRUE(node().updateSubOrder("", ""));
}

TEST_F(ReportClasses, CloseTheGapBelowTheirNewSuperiorWhereTheyAreSavedOnceMore) {
  for (const char* name : {"A", "C"}) add(name);
  for (const char* name : {"X", "Y"}) add(name, "A");
  for (const char* name : {"P", "Q"}) add(name, "C");
  Directory moved = loaded("X");
  moved.superClass("C");
  ASSERT_TRUE(moved.Save());
  EXPECT_EQ(row("Y") + " " + row("X"), ".A.Y.|A,Y|1|001.001 .C.X.|C,X|3|002.003");
  ASSERT_TRUE(moved.Save());
  EXPECT_EQ(row("Q") + " " + row("X"), ".C.Q.|C,Q|1|002.001 .C.X.|C,X|3|002.003");
}

TEST_F(ReportClasses, ThatWereInsertedAndAreSavedAgainCloseAGapAmongTheRoots) {
  for (const char* name : {"R1", "R2", "R3"}) add(name);
  Directory b = node();
  b.Class("B");
  b.superClass("R1");
  ASSERT_TRUE(b.Save());
  b.ordNo(1);
  ASSERT_TRUE(b.Save());
  EXPECT_EQ(row("B"), ".R1.B.|R1,B|2|001.002");
  EXPECT_EQ(row("R2"), ".R2.|R2|1|001");
  EXPECT_EQ(row("R3"), ".R3.|R3|2|002");
}

TEST_F(ReportClasses, LoseAZeroWhereTheNumberLosesADigitUntilTheyAreReordered) {
  String names;
  for (int i = 1; i <= 10; ++i) {
    add("c" + std::to_string(i));
    names += (i > 1 ? ",c" : "c") + std::to_string(i);
  }
  Directory third = loaded("c3");
  third.Save();
  EXPECT_EQ(row("c10"), ".c10.|c10|9|09");
  EXPECT_EQ(row("c9"), ".c9.|c9|8|008");
  EXPECT_EQ(row("c3"), ".c3.|c3|10|010");
  EXPECT_TRUE(node().updateSubOrder("", names));
  EXPECT_EQ(row("c10"), ".c10.|c10|10|010");
}

TEST_F(ReportClasses, AreRefusedAThousandthPlace) {
  String values;
  for (int i = 1; i < 1000; ++i) values += (i > 1 ? ",('c" : "('c") + std::to_string(i) + "','')";
  add("A");
  tables_.run("insert into RptDirectory(class,superClass) values " + values);
  Directory late = node();
  late.Class("late");
  EXPECT_EQ(refusal(late, late.Save()), number::argument);
  Directory a = loaded("A");
  EXPECT_FALSE(a.Save());
  EXPECT_EQ(row("A"), ".A.|A|1|001");
}

TEST_F(ReportClasses, ThatAreDeletedLeaveTheirBranchCutOff) {
  add("A");
  add("B", "A");
  add("C", "B");
  Directory b = loaded("B");
  EXPECT_TRUE(b.Delete());
  EXPECT_EQ(row("C"), ".C.|.,C|1|001.001.001");
  EXPECT_EQ(tables_.text("select superClass from RptDirectory where class='C'"), "B");
  EXPECT_EQ(refusal(b, b.Delete()), static_cast<Long>(0x80040578));
  EXPECT_EQ(b.errDescription(), "Classification [B] does not exist.");
  EXPECT_TRUE(b.Delete("A"));
}

TEST_F(ReportClasses, AreListedFlatWithEveryAttributeInItsOrder) {
  EXPECT_EQ(node().GetAll(), "<ds/>");
  tables_.run(
      "insert into RptDirectory(class,superClass,path,fullName,CreUId,CreUName,CreateTime,UpdUId,UpdUName,UpdTime,"
      "OtherCanUpd,ordNo,ordPath) values('B','A','.A.B.','A,B',1,'<Ann','20240307 14:05:09',2,'Bob','20240308',1,"
      "3,'001.003')");
  tables_.run("insert into RptDirectory(class) values('A')");
  const String a =
      R"(<d super="" path="" full="" creUserId="0" creUserName="" createTime="0" updUserId="0" updUserName="" )"
      R"(updTime="0" OtherCanDesign="0" ordno="0" ordpath="">A</d>)";
  const String b = R"(<d super="A" path=".A.B." full="A,B" creUserId="1" creUserName="&lt;Ann" )"
                   R"(createTime="2024-03-07 14:05:09" updUserId="2" updUserName="Bob" updTime="2024-03-08 00:00:00" )"
                   R"(OtherCanDesign="1" ordno="3" ordpath="001.003">B</d>)";
  EXPECT_EQ(node().GetAll(), "<ds>" + a + b + "</ds>");
  EXPECT_EQ(node().GetAll("  "), "<ds>" + a + "</ds>");
  EXPECT_EQ(node().GetAll("A"), "<ds>" + b + "</ds>");

  Directory lost = node();
  tables_.run("drop table QVSys..RptDirectory");
  EXPECT_EQ(lost.GetAll(), "");
  EXPECT_EQ(lost.errNumber(), number::noTable);
}

}  // namespace
}  // namespace QVSa
