#include "tests/organisation/Company.h"
#include "tests/support/Failures.h"

namespace QVSa {
namespace {

using test::Lines;
using test::listed;
using test::names;

Lines numbers(const Departments& departments) {
  return listed(departments, [](const Department& department) { return department.Id(); });
}

class DepartmentsTest : public test::Company {
 protected:
  Departments departments_ = connected<Departments>();
};

TEST_F(DepartmentsTest, TheTreeComesInPathOrderOrByLevelInsideOrOutsideOrBoth) {
  addDepartment("A", "Annex", "E");
  auto guests = connected<Department>();
  guests.Id("G");
  guests.Name("Guests");
  guests.Super("_out");
  guests.isOuter(true);
  ASSERT_TRUE(guests.Save());

  ASSERT_TRUE(departments_.GetAll());
  EXPECT_EQ(numbers(departments_), (Lines{"_root", "S", "E", "H", "A", "W", "_out", "G"}));
  ASSERT_TRUE(departments_.GetAllWithLevel());
  EXPECT_EQ(numbers(departments_), (Lines{"_root", "S", "W", "E", "A", "H", "_out", "G"}));
  ASSERT_TRUE(departments_.GetAll(1));
  EXPECT_EQ(numbers(departments_), (Lines{"_out", "G"}));
  ASSERT_TRUE(departments_.GetAllWithLevel(1));
  EXPECT_EQ(numbers(departments_), (Lines{"_out", "G"}));
  ASSERT_TRUE(departments_.GetAllWithLevel(0));
  EXPECT_EQ(departments_.Count(), 6);
  ASSERT_TRUE(departments_.GetAll(2));
  EXPECT_EQ(departments_.Count(), 8) << "any other choice lists all";
  EXPECT_TRUE(departments_.Item("g")->isOuter());
}

TEST_F(DepartmentsTest, ASubtreeIsFoundByTheInnerIdsInItsPaths) {
  ASSERT_TRUE(departments_.GetAll(-1, idOf("E")));
  EXPECT_EQ(numbers(departments_), (Lines{"E", "H"}));
  const auto hub = departments_.Item("H");
  EXPECT_EQ(hub->Super(), "E");
  EXPECT_EQ(text(hub->superInnerId()), idOf("E"));
  EXPECT_EQ(hub->fullName(), "Sales-East-Hub");
  EXPECT_EQ(hub->fullId(), department("H").fullId());
  EXPECT_EQ(hub->Org(), "");
  hub->Name("Hut");
  ASSERT_TRUE(hub->Save());
  EXPECT_EQ(department("H").fullName(), "Sales-East-Hut");

  ASSERT_TRUE(departments_.GetAll(0, idOf("W") + "," + idOf("S") + "," + idOf("H")));
  EXPECT_EQ(numbers(departments_), (Lines{"S", "E", "H", "W"})) << "each once, however many of the ids lead to it";
  EXPECT_EQ(refusal(departments_, departments_.GetAll(-1, "E")), number::statement)
      << "the ids stand in the statement as they are";
  ASSERT_TRUE(departments_.GetAll(1, idOf("S")));
  EXPECT_EQ(departments_.Count(), 0);
}

TEST_F(DepartmentsTest, TheRootsFailForTheColumnThatTheirStatementLacks) {
  EXPECT_EQ(refusal(departments_, departments_.GetRoot()), number::noField);
  EXPECT_EQ(departments_.Count(), 0);
  tables_.run("delete from departments where superDept=0");
  EXPECT_TRUE(departments_.GetRoot());
}

TEST_F(DepartmentsTest, ADepartmentInMemoryNeedsItsInnerId) {
  EXPECT_EQ(test::failureOf([&] { departments_.Add("N", "New"); }), number::type);
  String innerId = "77", fullName = "Top-New";
  const auto added = departments_.Add("N", "New", "S", true, &innerId, &fullName);
  EXPECT_EQ(added->InnerId(), 77);
  EXPECT_EQ(departments_.Item("n"), added);
  EXPECT_EQ(test::failureOf([&] { departments_.Add("n", "Again", "", false, &innerId); }), number::keyExists);
  EXPECT_EQ(departments_.Count(), 1);
}

TEST_F(DepartmentsTest, ARecordListsItselfWithAllBelowItAndCantListItsChildren) {
  auto sales = department("S");
  const auto below = sales.GetAllSub();
  ASSERT_NE(below, nullptr);
  Lines found = numbers(*below);
  std::sort(found.begin(), found.end());
  EXPECT_EQ(found, (Lines{"E", "H", "S"}));
  EXPECT_TRUE(below->Item("S")->isOrg());
  EXPECT_FALSE(below->Item("E")->isOrg());
  EXPECT_EQ(below->Item("H")->fullName(), "Sales-East-Hub");
  EXPECT_FALSE(below->Item("H")->Save()) << "the list is not connected";

  EXPECT_EQ(sales.GetSub(), nullptr);
  EXPECT_EQ(sales.errNumber(), number::type);
  EXPECT_EQ(department("H").GetSub()->Count(), 0);
}

TEST_F(DepartmentsTest, ARecordListsTheUsersWhoseDepartmentNumberReadsAsItsInnerId) {
  addUser("ann", "E");
  addDepartment(idOf("E"), "Odd", "W");
  addUser("bob", idOf("E"));
  EXPECT_EQ(names(*department("E").GetUsers()), (Lines{"bob"}));
}

class WaysUpTest : public DepartmentsTest {
 protected:
  WaysUpTest() : hub_(job(manager_, "H")), works_(job(manager_, "W")) {}

  String both() const { return text(hub_) + "," + text(works_); }

  Long hub_;
  Long works_;
};

TEST_F(WaysUpTest, TheWaysUpFromJobsAreOneListByPathOrByLevel) {
  ASSERT_TRUE(departments_.getAllSuper(both()));
  EXPECT_EQ(names(departments_), (Lines{"Company", "Sales", "East", "Hub", "Works"}));
  ASSERT_TRUE(departments_.getAllSuperWithLevel(both()));
  EXPECT_EQ(names(departments_), (Lines{"Company", "Sales", "Works", "East", "Hub"}));
  const auto hub = departments_.Item("Sales-East-Hub");
  ASSERT_NE(hub, nullptr) << "by level the key is the full name";
  EXPECT_EQ(hub->Id(), "H");
  EXPECT_EQ(text(hub->InnerId()), idOf("H"));
  EXPECT_EQ(text(hub->superInnerId()), idOf("E"));
  EXPECT_FALSE(hub->Save()) << "the records are not connected";
}

TEST_F(WaysUpTest, AnOrganisationOrADepartmentNarrowsThem) {
  for (const auto list : {&Departments::getAllSuper, &Departments::getAllSuperWithLevel}) {
    ASSERT_TRUE((departments_.*list)(both(), 1, "S", -1)) << departments_.errDescription();
    EXPECT_EQ(names(departments_), (Lines{"Sales", "East", "Hub"}));
    ASSERT_TRUE((departments_.*list)(both(), 1, "S", 1));
    EXPECT_EQ(names(departments_), (Lines{"Sales", "East"})) << "above the jobs' own department";
    ASSERT_TRUE((departments_.*list)(both(), 0, "", 0));
    EXPECT_EQ(departments_.Count(), 2) << "the jobs' own departments";
    ASSERT_TRUE((departments_.*list)(both(), 2, idOf("W"), -1));
    EXPECT_EQ(names(departments_), (Lines{"Company", "Works"}));
    ASSERT_TRUE((departments_.*list)("", 0, "", -1)) << departments_.errDescription();
    EXPECT_EQ(departments_.Count(), 0);
  }
}

TEST_F(WaysUpTest, ANameThatComesAgainEndsTheListByPathAlone) {
  auto works = department("W");
  works.Name("East");
  ASSERT_TRUE(works.Save());
  EXPECT_EQ(refusal(departments_, departments_.getAllSuper(both())), number::keyExists);
  EXPECT_EQ(departments_.errDescription().substr(0, 23), "Error in listing users ");
  EXPECT_EQ(departments_.Count(), 4);
  EXPECT_TRUE(departments_.getAllSuperWithLevel(both()));
  EXPECT_EQ(departments_.Count(), 5);
}

}  // namespace
}  // namespace QVSa
