#include "tests/organisation/Company.h"
#include "tests/support/Failures.h"

namespace QVSa {
namespace {

using test::Lines;
using test::listed;
using test::names;

class UsersTest : public test::Company {
 protected:
  UsersTest() {
    managerHub_ = job(manager_, "H");
    ann_ = addUser("ann", "E", "2,4");
    bob_ = addUser("bob", "H", text(managerHub_));
    cleo_ = addUser("cleo", "W");
  }

  Long managerHub_;
  Long ann_;
  Long bob_;
  Long cleo_;
  Users users_ = connected<Users>();
};

TEST_F(UsersTest, UsersAreFilteredByDepartmentRoleGroupAndKind) {
  ASSERT_TRUE(users_.GetAll());
  EXPECT_EQ(names(users_), (Lines{"Administrator", "ann", "bob", "cleo"})) << "locked ones too";
  ASSERT_TRUE(users_.GetAll("", 0, true));
  EXPECT_EQ(names(users_), (Lines{"ann", "bob", "cleo"}));
  ASSERT_TRUE(users_.GetAll("E", 0, true));
  EXPECT_EQ(names(users_), (Lines{"ann"})) << "a department without those below it";

  const userGroup deputies = addGroup("Deputies", text(cleo_), "Manager");
  ASSERT_TRUE(users_.GetAll("", manager_.Id()));
  EXPECT_EQ(names(users_), (Lines{"bob", "cleo"})) << "directly or through a group";
  ASSERT_TRUE(users_.GetAll("", 0, false, 0));
  EXPECT_EQ(names(users_), (Lines{"Administrator", "ann", "bob"})) << "in no group";
  ASSERT_TRUE(users_.GetAll("", 0, false, deputies.Id()));
  EXPECT_EQ(names(users_), (Lines{"cleo"}));

  tables_.run("update users set uType=3,accstate=2 where userName='bob' update users set uType=3 where userName='ann'");
  ASSERT_TRUE(users_.GetAll("", 0, false, -1, 3));
  EXPECT_EQ(names(users_), (Lines{"ann"}));
}

TEST_F(UsersTest, AListedUserHoldsHisAccountHisBuiltInJobsAndHisGroups) {
  addGroup("One", text(ann_));
  addGroup("Two", text(ann_));
  tables_.run(
      "update users set "
      "mobilePhone='m',email='e',useSms=1,useKey=1,accstate=1,uType=3,domain='d',company='c',address='a',"
      "zipcode='z',telephone='t',isouter=1,ldDn='cn=ann',PwdNoChange=1,useOTPAuth=1,OTPTokenId='o' where "
      "userName='ann'");
  ASSERT_TRUE(users_.GetAll());
  const auto ann = users_.Item("ANN");
  EXPECT_EQ(ann->Id(), ann_);
  EXPECT_EQ(ann->MobilePhone() + ann->Email() + ann->Domain() + ann->company() + ann->Address() + ann->zipcode() +
                ann->telePhone() + ann->dn() + ann->OTPTokenId(),
            "medcaztcn=anno");
  for (const Boolean set : {ann->sendSms(), ann->keyLogin(), ann->locked(), ann->isOuter(), ann->PwdNoChange(),
                            ann->useOTPAuth(), ann->isUser(), ann->isDesigner(), ann->isDeptadmin()})
    EXPECT_TRUE(set);
  EXPECT_FALSE(ann->isAdministrator() || ann->isOwner() || ann->builtIn());
  EXPECT_EQ(ann->deptId(), idOf("E"));
  EXPECT_EQ(ann->deptName(), "East");
  EXPECT_EQ(ann->deptFullName(), "Sales-East");
  EXPECT_EQ(ann->grpName(), "One,Two");

  const auto administrator = users_.Item("Administrator");
  EXPECT_TRUE(administrator->isAdministrator() && administrator->builtIn());
  const auto cleo = users_.Item("cleo");
  EXPECT_FALSE(cleo->isDesigner() || cleo->locked() || cleo->isOuter());
  EXPECT_EQ(cleo->grpName(), "");
  EXPECT_TRUE(cleo->GetOne(3, "cleo")) << "the records are connected";
}

TEST_F(UsersTest, RegistrationsAreListedByTheirStateWithWhatTheySaidOfThemselves) {
  tables_.run(
      "update users set uType=2,accstate=2,deptId=null where userName='ann' update users set uType=2 where "
      "userName='bob'"
      "insert into QVUserRegInfo(UserId,userDesc) select userId,'let me in' from users where userName='ann'");
  ASSERT_TRUE(users_.GetAllReg());
  EXPECT_EQ(users_.Count(), 2);
  EXPECT_EQ(users_.Item("ann")->RegUserDesc(), "let me in");
  EXPECT_EQ(users_.Item("ann")->deptId(), "") << "a user without a department comes back";
  EXPECT_TRUE(users_.Item("ann")->isDesigner());
  EXPECT_EQ(users_.Item("bob")->RegUserDesc(), "");
  ASSERT_TRUE(users_.GetAllReg(2));
  EXPECT_EQ(names(users_), (Lines{"ann"}));
  ASSERT_TRUE(users_.GetAllReg(3));
  EXPECT_EQ(users_.Count(), 0);
  EXPECT_EQ(refusal(users_, users_.GetAllReg(-1, 5)), number::statement)
      << "the clause of the department is never filled";
}

TEST_F(UsersTest, ASubtreeListsItsUsersAndByRoleEachNameOnce) {
  ASSERT_TRUE(users_.GetAllOfTheDept(department("S").InnerId()));
  EXPECT_EQ(listed(users_, [](const User& user) { return user.Name() + " " + user.deptFullName(); }),
            (Lines{"ann Sales-East", "bob Sales-East-Hub"}));
  ASSERT_TRUE(users_.GetAllOfTheDeptAndRole(department("S").InnerId()));
  EXPECT_EQ(names(users_), (Lines{"ann", "bob"})) << "ann has two roles and stands once";
  EXPECT_EQ(users_.errNumber(), 0);
  EXPECT_EQ(text(users_.Item("bob")->deptInnerId()), idOf("H"));
  EXPECT_EQ(users_.Item("bob")->deptName(), "Hub");
  addGroup("Deputies", text(cleo_), "Manager");
  ASSERT_TRUE(users_.GetAllOfTheDeptAndRole(0, "manager"));
  EXPECT_EQ(names(users_), (Lines{"bob", "cleo"}));
}

TEST_F(UsersTest, APickerTakesHoldersOfJobsAndPeopleOfOneOrganisationOrDepartment) {
  ASSERT_TRUE(users_.getAllForSelUser());
  EXPECT_EQ(users_.Count(), 4);
  EXPECT_EQ(users_.Item("bob")->deptId(), idOf("H"));
  EXPECT_EQ(users_.Item("bob")->deptFullName(), "Sales-East-Hub");
  ASSERT_TRUE(users_.getAllForSelUser("2," + text(managerHub_)));
  EXPECT_EQ(names(users_), (Lines{"ann", "bob"}));
  ASSERT_TRUE(users_.getAllForSelUser("", ann_, 1));
  EXPECT_EQ(names(users_), (Lines{"ann", "bob"})) << "both under Sales";
  ASSERT_TRUE(users_.getAllForSelUser("", ann_, 2));
  EXPECT_EQ(names(users_), (Lines{"ann"}));
  ASSERT_TRUE(users_.getAllForSelUser("1", cleo_, 1));
  EXPECT_EQ(names(users_), (Lines{"Administrator"})) << "nearest organisation of Works is the root";
}

TEST_F(UsersTest, TheGridStandsByItselfUntilTheNextOneReplacesIt) {
  tables_.run("update users set accstate=1 where userName='ann' update users set accstate=2 where userName='bob'");
  EXPECT_EQ(users_.DataMembers(), (Lines{"users"}));
  EXPECT_EQ(users_.GetDataMember("users").State(), 0);
  EXPECT_EQ(users_.GetList(department("S").InnerId()), 2);
  Recordset& grid = users_.GetDataMember("whatever");
  tables_.run("delete from users where userName='bob'");
  Lines columns, rows;
  for (std::size_t i = 0; i < grid.fieldCount(); ++i) columns.push_back(grid[i].Name());
  EXPECT_EQ(columns, (Lines{"", "userid", "Name", "Login", "Department", "Remark", "State"}));
  for (; !grid.EOF_(); grid.MoveNext()) {
    String row;
    for (std::size_t i = 0; i < grid.fieldCount(); ++i) row += grid[i].asText() + "|";
    rows.push_back(row);
  }
  EXPECT_EQ(rows, (Lines{"|" + text(ann_) + "|ann|ann|East||Locked|", "|" + text(bob_) + "|bob|bob|Hub|||"}));
  grid.MoveFirst();
  EXPECT_EQ(grid["Name"].asText(), "ann");
  EXPECT_EQ(users_.Count(), 0) << "the items are another matter";

  EXPECT_EQ(users_.GetList(0), 3);
  EXPECT_EQ(users_.GetDataMember("").RecordCount(), 3);
  grid.MoveFirst();
  EXPECT_EQ(grid["Remark"].asText(), "BuiltIn");
}

TEST_F(UsersTest, SupervisionGoesByJobOrByPersonAndIsReplacedNotAdded) {
  auto ann = connected<User>(), bob = connected<User>(), cleo = connected<User>();
  ASSERT_TRUE(ann.GetOne(3, "ann") && bob.GetOne(3, "bob") && cleo.GetOne(3, "cleo"));
  Integer flag = 7;
  Long jobId = 7, userId = 7;
  ASSERT_TRUE(ann.getManager(flag, jobId, userId));
  EXPECT_EQ(flag, 7) << "nobody was set";

  ASSERT_TRUE(ann.setManager(2, 0, cleo_));
  ASSERT_TRUE(ann.setManager(1, managerHub_, cleo_));
  ASSERT_TRUE(ann.getManager(flag, jobId, userId));
  EXPECT_EQ(flag, 1);
  EXPECT_EQ(jobId, managerHub_);
  EXPECT_EQ(userId, cleo_) << "both ids are kept";
  ASSERT_TRUE(cleo.setManager(2, 0, bob_));
  const auto subordinates = bob.getSubUsers();
  ASSERT_NE(subordinates, nullptr);
  EXPECT_EQ(subordinates->Count(), 2);
  EXPECT_EQ(subordinates->Item("ann")->Login(), "ann");
  EXPECT_EQ(subordinates->Item("cleo")->Id(), cleo_);
  EXPECT_FALSE(subordinates->Item("ann")->GetOne(3, "ann")) << "the list is not connected";
  EXPECT_EQ(cleo.getSubUsers()->Count(), 0) << "only the job counts for ann";

  ASSERT_TRUE(ann.setManager(0));
  EXPECT_EQ(tables_.text("select flag,mgrId,jobId from userMgr where UserId=" + text(ann_)), "0|0|0");
  EXPECT_EQ(bob.getSubUsers()->Count(), 1);
}

TEST_F(UsersTest, ASupervisorThatIsNotNamedIsRefusedAndNothingChanges) {
  auto ann = connected<User>(), bob = connected<User>();
  ASSERT_TRUE(ann.GetOne(3, "ann") && ann.setManager(2, 0, bob_));
  EXPECT_EQ(refusal(ann, ann.setManager(1, 0, bob_)), messageNumber(1112));
  EXPECT_EQ(ann.errDescription(),
            "Error in setting up supervisor.Incomplete input, please provide superior department and role.");
  EXPECT_EQ(refusal(ann, ann.setManager(2, 5)), messageNumber(1113));
  ASSERT_TRUE(bob.GetOne(3, "bob"));
  EXPECT_EQ(bob.getSubUsers()->Count(), 1);
}

}  // namespace
}  // namespace QVSa
