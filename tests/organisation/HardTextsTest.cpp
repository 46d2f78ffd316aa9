#include "tests/organisation/Company.h"

namespace QVSa {
namespace {

// Texts that would break a statement, an XML text or a pattern which does not hold them apart from its own signs.
const String hardTexts[] = {"O'Brien''s",
                            "<roleDesc>x<gId>",
                            "[brackets] and ]]",
                            "100 % _under_",
                            "-- ; drop table roles",
                            "\xF0\x9F\x98\x80 smiles",
                            "\xE9\x94\x80\xE5\x94\xAE\xE9\x83\xA8",
                            "a|b\"c\\d\te",
                            "bell\x07 and \xEF\xBF\xBF"};

class HardTextsTest : public test::Company {
 protected:
  test::Lines tree() const { return tables_.rows("select deptNo,deptName,fullName,path from departments"); }
};

TEST_F(HardTextsTest, ARoleAGroupAndADepartmentAreFoundByThemAgain) {
  for (const String& name : hardTexts) {
    SCOPED_TRACE(name);
    auto role = connected<Role>();
    role.Name(name);
    ASSERT_TRUE(role.Save()) << role.errDescription();
    auto loaded = connected<Role>();
    ASSERT_TRUE(loaded.GetOne(2, name)) << loaded.errDescription();
    EXPECT_EQ(loaded.Name(), name);
    EXPECT_EQ(loaded.Id(), role.Id());

    userGroup group = addGroup(name, "1", name);
    String roles;
    ASSERT_TRUE(group.GetRoles(roles));
    EXPECT_EQ(roles, name);

    addDepartment("no " + name, name, "S");
    const Department below = department("no " + name);
    EXPECT_EQ(below.fullName(), "Sales-" + name);
    addUser(name, below.Id());
    auto user = connected<User>();
    EXPECT_TRUE(user.loginAuth(name, "secret", nullptr, false, "", name)) << user.errDescription();
    EXPECT_EQ(user.deptFullName(), "Sales-" + name);
    Jobs jobs = connected<Jobs>();
    ASSERT_TRUE(role.setJobs(text(below.InnerId())));
    ASSERT_TRUE(jobs.GetAll(below.Id(), name)) << jobs.errDescription();
    EXPECT_EQ(test::names(jobs), (test::Lines{"Sales-" + name + "--" + name}));
  }
  EXPECT_EQ(tables_.text("select count(*) from roles where builtIn=1"), "6");
  auto groups = connected<userGroups>();
  EXPECT_TRUE(groups.GetAll()) << groups.errDescription();
}

TEST_F(HardTextsTest, ATextOfFourThousandCharactersIsRefusedWhereItsColumnIsShorter) {
  const String longText(4000, 'x');
  auto role = connected<Role>();
  role.Name(longText);
  EXPECT_EQ(refusal(role, role.Save()), number::range);
  tables_.run("update departments set fullName='Sales-East-'+replicate('x',3985) where deptNo='H'");
  const test::Lines before = tree();
  Department sales = department("S");
  sales.Name("Sales and more");
  EXPECT_EQ(refusal(sales, sales.Save()), number::range) << "too long a full name, two levels below";
  EXPECT_EQ(tree(), before);
  EXPECT_EQ(refusal(role, role.GetOne(2, longText)), messageNumber(1201));
}

TEST_F(HardTextsTest, ATokenInACallersOwnSqlIsNone) {
  auto user = connected<User>();
  user.Name("1");
  user.Login("intruder");
  user.setJobs("<userName>");
  EXPECT_FALSE(user.Save()) << "job 1 is that of the administrators";
  auto log = connected<LogRecords>();
  std::vector<Variant> query{Date::empty(), Date::empty(), "", "<desc>", "", "%"};
  EXPECT_TRUE(log.Add(1, 1, "", ""));
  EXPECT_TRUE(log.GetLogByQuery(query, 1)) << log.errDescription();
  EXPECT_EQ(log.Count(), 0);
}

}  // namespace
}  // namespace QVSa
