#include "tests/console/Program.h"

namespace QVSa::console {
namespace {

using test::Outcome;

class Program : public test::Program {
 protected:
  void addAnn() { ASSERT_EQ(run("user add ann 'Ann A'", "Ann-pass-1\n").exitCode, 0); }
  String signOn(const String& login, const String& password) {
    return run("sign-on " + login, password + "\n").document["session"].get<String>();
  }

  void writeOrganisation(const String& departments, const String& users) {
    std::ofstream(folder_.path() / "departments.csv") << "number,name,superior,isOrganisation\n" << departments;
    std::ofstream(folder_.path() / "users.csv") << "login,name,department\n" << users;
  }
  String import(const String& more = "") {
    const Outcome outcome = run("import organisation '" + folder_.path().string() + "' " + more, "First-pass-1\n");
    EXPECT_EQ(outcome.exitCode, 0) << outcome.said << outcome.document;
    String result;
    for (const Json& counts : outcome.document["counts"])
      result += counts["what"].get<String>()[0] + counts["new"].dump() + counts["changed"].dump() +
                counts["unchanged"].dump() + counts["left"].dump() + " ";
    return result;
  }
};

TEST_F(Program, InitMakesAnInstallationWhoseAdministratorCanSignOn) {
  EXPECT_NE(signOn("Admin", "Adm1n-first"), "");
  const Json admin = run("user show Admin").document;
  EXPECT_EQ(admin["builtInRoles"], Json::array({"Administrators"}));
  EXPECT_EQ(admin["state"], "normal");
  EXPECT_EQ(run("doctor").exitCode, 0);
  EXPECT_EQ(run("init", "x\ny\n").exitCode, 1);
  EXPECT_NE(signOn("Admin", "Adm1n-first"), "");
}

TEST_F(Program, InitShowsThePasswordsThatItMadeUp) {
  const Outcome made = run("init '" + (folder_.path() / "other").string() + "' --make-passwords");
  const String password = made.document["adminPassword"];
  EXPECT_EQ(run("sign-on Admin", password + "\n").exitCode, 1);
  name_ = "other";
  EXPECT_NE(signOn("Admin", password), "");
  EXPECT_NE(made.document["saPassword"], made.document["adminPassword"]);
}

TEST_F(Program, SecretsOfAFileOpenTheInstallationsThatWereMadeWithThemAlone) {
  const auto file = folder_.path() / "secrets";
  ASSERT_EQ(run("secrets make '" + file.string() + "'").exitCode, 0);
  EXPECT_EQ(run("secrets make '" + file.string() + "'").error(), "58") << "those of before are not lost";

  const auto signOnWith = [&](const std::filesystem::path& secrets) {
    ::setenv("QVSA_SECRETS", secrets.c_str(), 1);
    const Outcome outcome = run("sign-on Admin", "Adm1n-first\n");
    ::setenv("QVSA_SECRETS", "", 1);
    return outcome.exitCode == 0 ? String("signed on") : outcome.error();
  };
  EXPECT_EQ(signOnWith(file), "0x80040E4D");
  name_ = "own";
  ::setenv("QVSA_SECRETS", file.c_str(), 1);
  EXPECT_EQ(run("init", "Adm1n-first\nSa-first\n").document["builtInSecrets"], false);
  EXPECT_EQ(signOnWith(file), "signed on");
  EXPECT_EQ(signOnWith(""), "0x80040E4D");

  EXPECT_EQ(signOnWith(folder_.path() / "none"), "53");
  std::filesystem::permissions(file, std::filesystem::perms::others_read, std::filesystem::perm_options::add);
  EXPECT_EQ(signOnWith(file), "70");
  std::filesystem::permissions(file, std::filesystem::perms::others_read, std::filesystem::perm_options::remove);
  std::ofstream(file, std::ios::app) << "conPwdHead = x\n";
  EXPECT_EQ(signOnWith(file), "5");
}

TEST_F(Program, RefusalsAndMisuseHaveTheirOwnExitCodes) {
  const Outcome wrong = run("sign-on Admin", "wrong\n");
  EXPECT_EQ(wrong.exitCode, 1);
  EXPECT_EQ(wrong.error(), "0x80040452");
  EXPECT_EQ(run("sign-on nobody", "x\n").error(), "0x8004044D");
  for (const char* misuse :
       {"", "dept show", "sign-on Admin --password x", "no-such-command", "number rule add x --reuse often",
        "init \"it's\"", "doctor --database 'a b'", "init 'a\\b'", "init --script x.sql", "doctor --encryption none"})
    EXPECT_EQ(run(misuse, "x\n").exitCode, 2) << misuse;
  EXPECT_EQ(run("sign-on Admin", "").exitCode, 2);
  name_ = "missing";
  EXPECT_EQ(run("doctor").exitCode, 1);
}

TEST_F(Program, AChangeOfPasswordLeavesNoSessionAndHeedsTheFlagAgainstIt) {
  addAnn();
  ASSERT_EQ(run("password ann", "Ann-pass-1\nAnn-pass-2\n").exitCode, 0);
  execute("update users set PwdNoChange=1 where userLogin='ann'");
  EXPECT_EQ(run("password ann", "Ann-pass-2\nAnn-pass-3\n").exitCode, 1);
  EXPECT_EQ(value("select count(*) from seslog"), "0");
  EXPECT_NE(signOn("ann", "Ann-pass-2"), "");
}

TEST_F(Program, UnlockOpensALockedAccount) {
  addAnn();
  run("policy set --lock-after 1");
  EXPECT_EQ(run("sign-on ann", "wrong\n").error(), "0x8004045E");
  EXPECT_EQ(run("user unlock ann").exitCode, 0);
  EXPECT_NE(signOn("ann", "Ann-pass-1"), "");
  EXPECT_EQ(run("user unlock ann").exitCode, 1);
}

TEST_F(Program, PruneEndsIdleSessionsAloneAndTheirNumbersComeBack) {
  const String idle = signOn("Admin", "Adm1n-first");
  const String busy = signOn("Admin", "Adm1n-first");
  run("number rule add invoice --prefix I --digits 3 --reuse any");
  const String number = run("number issue invoice --record r1 --session " + idle).document["number"];
  execute("update seslog set lastActTime=dateadd(minute,-31,getdate()) where sesId='" + idle + "'");
  EXPECT_EQ(run("sessions prune --idle 30").document["ended"], Json::array({idle}));
  const Json left = run("sessions list").document["sessions"];
  ASSERT_EQ(left.size(), 1U);
  EXPECT_EQ(left[0]["session"], busy);
  EXPECT_EQ(run("number issue invoice --record r2").document["number"], number);
  EXPECT_EQ(run("sessions end " + idle).exitCode, 1);
  EXPECT_EQ(run("sessions end " + busy).exitCode, 0);
}

TEST_F(Program, NumbersFollowTheirRuleAndItsStart) {
  run("number rule add order --prefix O- --date none --digits 4");
  EXPECT_EQ(run("number issue order").document["number"], "O-0001");
  run("number start order 50");
  EXPECT_EQ(run("number issue order").document["number"], "O-0050");
  EXPECT_EQ(run("number rule list").document["rules"].size(), 1U);
  EXPECT_EQ(run("number rule set order --date yymm").error(), "5") << "there are numbers";
  EXPECT_EQ(run("number rule set order --prefix P- --digits 5").document["sample"], "P-00001");
  EXPECT_EQ(run("number rule set order --date yymm --with-numbers").document["date"], "yymm");
  EXPECT_EQ(run("number rule add order").error(), "0x80040E2F");
  EXPECT_EQ(run("number issue nothing").error(), "0x800405DE");
}

TEST_F(Program, ThePolicyKeepsWhatIsNotNamed) {
  run("policy set --min-length 8 --mixed-case --other-characters --lock-after 3");
  const Json policy = run("policy set --no-mixed-case --history 2").document;
  EXPECT_EQ(policy["otherCharacters"], true);
  EXPECT_EQ(policy["minLength"], 8);
  EXPECT_EQ(policy["lockAfter"], 3);
  EXPECT_EQ(policy["mixedCase"], false);
  EXPECT_EQ(policy["history"], 2);
  EXPECT_TRUE(run("policy set --lock-after 0").document["lockAfter"].is_null());
}

TEST_F(Program, DepartmentsMoveWithTheirBranchButNeverBelowThemselves) {
  run("dept add a A");
  run("dept add b B --under a");
  run("dept add c C --organisation");
  EXPECT_EQ(run("dept move a b").exitCode, 1);
  EXPECT_EQ(run("dept move a a").exitCode, 1);
  EXPECT_EQ(run("dept move _OUT _root").exitCode, 1);
  EXPECT_EQ(run("dept rename _root Acme").exitCode, 1) << "the company's name is a setting";
  EXPECT_EQ(run("dept move a c").exitCode, 0);
  EXPECT_EQ(run("dept show b").document["fullName"], "C-A-B");
  EXPECT_EQ(run("dept show b").document["organisation"], "c");
  EXPECT_EQ(run("dept rename c See").document["fullName"], "See");
  EXPECT_EQ(run("dept show b").document["fullName"], "See-A-B");
  EXPECT_EQ(run("dept add a Again").exitCode, 1);
  execute("update departments set path=null where deptNo='c'");
  EXPECT_EQ(run("dept add c Again").error(), "94") << "it can't be read, and is there";
  EXPECT_EQ(value("select deptName from departments where deptNo='c'"), "See");
  EXPECT_EQ(run("dept remove a").error(), "0x800403EC");
  EXPECT_EQ(run("dept remove _out").exitCode, 1);
  EXPECT_EQ(run("dept remove b").exitCode, 0);
  EXPECT_EQ(run("dept show b").error(), "0x800403E9");
}

TEST_F(Program, AnImportCanBeRunAgainAndChangesWhatDiffers) {
  writeOrganisation("_root,Top,,1\nd1,One,_root,1\nd2,Two,d1,0\n", "ann,Ann,d2\nbob,Bob,d1\n");
  EXPECT_EQ(import("--dry-run"), "d2100 u2000 ");
  EXPECT_EQ(value("select count(*) from departments"), "2");
  EXPECT_EQ(import(), "d2100 u2000 ");
  EXPECT_EQ(import(), "d0030 u0020 ");
  EXPECT_EQ(run("dept show d2").document["fullName"], "One-Two");
  EXPECT_NE(signOn("ann", "First-pass-1"), "");

  writeOrganisation("_root,Another,,1\nd1,Uno,_root,1\nd2,Two,d1,0\n", "ann,Ann,d1\nbob,Bob B,d1\n");
  execute("insert into userJob(userId,jobId) select userId,2 from users where userLogin='bob'");
  EXPECT_EQ(import(), "d0111 u0200 ");
  EXPECT_EQ(run("dept show d2").document["fullName"], "Uno-Two");
  EXPECT_EQ(run("dept show _root").document["name"], "Top");
  EXPECT_EQ(run("user show ann").document["departmentNumber"], "d1");
  EXPECT_EQ(value("select count(*) from userJob where jobId=2"), "1");
  EXPECT_NE(signOn("ann", "First-pass-1"), "");
}

TEST_F(Program, AnImportOfHoldingsAddsWhatIsMissing) {
  writeOrganisation("_root,Top,,1\nd1,One,_root,1\nd2,Two,d1,0\n", "ann,Ann,d2\nbob,Bob,d1\n");
  const auto write = [&](const String& rows) {
    std::ofstream(folder_.path() / "holdings.csv") << "login,role,department\n" << rows;
  };
  write("ann,Clerk,d2\nann,Clerk,d1\nbob,Clerk,d1\nbob,Administrators,_root\n");
  EXPECT_EQ(import("--dry-run"), "d2100 u2000 r1010 j2010 h4000 ");
  EXPECT_EQ(value("select count(*) from roles where builtIn=0"), "0");
  EXPECT_EQ(import(), "d2100 u2000 r1010 j2010 h4000 ");
  EXPECT_EQ(import(), "d0030 u0020 r0020 j0030 h0040 ");
  write("bob,Clerk,d1\nbob,Clerk,d2\n");
  EXPECT_EQ(import(), "d0030 u0020 r0010 j0020 h1010 ");
  EXPECT_EQ(run("role holders Clerk").document["holders"].size(), 2U);
  EXPECT_EQ(run("job list --user ann").document["jobs"].size(), 2U) << "nothing is taken away";

  execute("update departments set deptNo='D1' where deptNo='d1'");
  write("ann,clerk,d1\nbob,CLERK,d1\nbob,Chief,d1\nbob,chief,d1\n");
  EXPECT_EQ(import(), "d0030 u0020 r1010 j1010 h1030 ") << "the database ignores the case";
}

TEST_F(Program, RolesAreSetInDepartmentsAndHeldThere) {
  addAnn();
  run("dept add a A");
  run("dept add b B --under a");
  EXPECT_EQ(run("role add Clerk --description 'Does it'").exitCode, 0);
  EXPECT_EQ(run("role add clerk").error(), "0x800404B9");
  EXPECT_EQ(run("role give Clerk ann b").error(), "0x800404BA");
  for (const char* nothing : {"job list --dept x", "job list --role x", "user list --dept x", "user list --dept ''",
                              "user list --dept a --below --role x", "role holders Clerk --dept x"})
    EXPECT_EQ(run(nothing).exitCode, 1) << nothing;
  EXPECT_EQ(run("role set Clerk --in a,b").document["jobs"].size(), 2U);
  EXPECT_EQ(run("role give Clerk ann b").exitCode, 0);
  EXPECT_EQ(run("role holders Clerk").document["holders"][0]["login"], "ann");
  const Json jobs = run("job list --dept a --below").document["jobs"];
  ASSERT_EQ(jobs.size(), 2U);
  EXPECT_EQ(jobs[1]["name"], "A-B--Clerk");
  const Json chain = run("job chain " + jobs[1]["job"].dump()).document["departments"];
  ASSERT_EQ(chain.size(), 3U);
  EXPECT_EQ(chain[2]["department"], "b");
  EXPECT_EQ(run("role reach Clerk").document["acl"], "");
  EXPECT_EQ(run("role set Clerk --out-of b").document["jobs"].size(), 1U);
  EXPECT_EQ(run("role holders Clerk").document["holders"].size(), 0U);
  EXPECT_EQ(run("role remove Administrators").exitCode, 1);
  EXPECT_EQ(run("role remove Clerk").exitCode, 0);
  EXPECT_EQ(run("role list").document["roles"].size(), 6U);
}

TEST_F(Program, SupervisorsAreSetByJobOrByUser) {
  addAnn();
  run("user add bob Bob", "Bob-pass-1\n");
  EXPECT_EQ(run("user manager bob --job 1").document["job"], "Company--Administrators");
  EXPECT_EQ(run("user manager Admin").document["subordinates"][0]["login"], "bob");
  EXPECT_EQ(run("user manager bob --user ann").document["supervisor"], "Ann A");
  EXPECT_EQ(run("user manager Admin").document["subordinates"].size(), 0U);
  EXPECT_TRUE(run("user manager bob --none").document["supervisor"].is_null());
  for (const char* nobody : {"--job 99", "--job 0", "--user ''"})
    EXPECT_EQ(run(String("user manager bob ") + nobody).exitCode, 1) << nobody;
  EXPECT_EQ(run("user list --role Administrators").document["users"][0]["login"], "Admin");
}

TEST_F(Program, WhatWasDoneIsToldAlsoWhereTwoBearOneName) {
  addAnn();
  run("user add ann2 'Ann A'", "Ann-pass-1\n");
  run("group add Twins");
  EXPECT_EQ(run("group set Twins --members ann,ann2").document["members"].size(), 2U);
  run("user manager ann --user Admin");
  run("user manager ann2 --user Admin");
  const Outcome set = run("user manager Admin --job 1");
  EXPECT_EQ(set.exitCode, 0);
  EXPECT_EQ(set.document["job"], "Company--Administrators");
  EXPECT_EQ(set.document["note"].get<String>().substr(0, 38), "Error in listing user's subordinates.T");

  execute("drop table grpRole");
  const Json refused = run("group set Twins --members ann --roles Administrators").document["error"];
  EXPECT_EQ(refused["description"].get<String>().substr(0, 39), "The members are set, the roles are not:");
}

TEST_F(Program, TheTreeIsDrawnWithEachBranchUnderItsSuperior) {
  run("dept add b B --organisation");
  run("dept add c C --under b");
  run("dept add a A");
  const Json tree = run("dept tree --under _root").document["tree"];
  ASSERT_EQ(tree.size(), 1U);
  EXPECT_EQ(tree[0]["below"][0]["number"], "a");
  EXPECT_EQ(tree[0]["below"][1]["below"][0]["name"], "C");
  EXPECT_EQ(
      shown("dept tree --under _root"),
      "Company *  (_root)\n├── A  (a)\n└── B *  (b)\n    └── C  (c)\n\n4 departments; * marks an organisation.\n");
  EXPECT_EQ(run("dept list --by-level").document["departments"][3]["number"], "c");
  execute("update departments set superDept=" + value("select deptId from departments where deptNo='c'") +
          " where deptNo='b'");
  EXPECT_EQ(run("dept tree").document["onNoTop"], Json::array({"b", "c"}));
}

TEST_F(Program, PasswordsOfLogInsAreChangedByTheAdministrator) {
  EXPECT_EQ(run("login password QVUser", "wrong\nOther-pass\n").error(), "0x80040E4D");
  EXPECT_EQ(run("login password QVUser", "Sa-first\nOther;pass\n").error(), "5");
  ASSERT_EQ(run("login password sa", "Sa-first\nSa-second\n").exitCode, 0);
  ASSERT_EQ(run("login password QVUser", "Sa-second\nOther-pass\n").exitCode, 0);
  EXPECT_EQ(run("user show Admin").error(), "0x80040E4D");
  name_ += "|" + run("secrets scramble", "Other-pass\n").document["scrambled"].get<String>();
  EXPECT_EQ(run("user show Admin").exitCode, 0);
}

TEST_F(Program, DoctorTellsWhatASignOnWouldPassOver) {
  execute("drop table saferule");
  const Outcome outcome = run("doctor");
  EXPECT_EQ(outcome.exitCode, 1);
  EXPECT_EQ(outcome.document["points"][0]["state"], "BAD");
  EXPECT_EQ(outcome.document["points"][1]["state"], "good");
}

TEST_F(Program, ATableShowsItsColumnsAsWideAsTheirTexts) {
  run("group add 王小明的组 --description first");
  run("group add B --description second");
  EXPECT_EQ(shown("group list"),
            "Id  Name        Description\n"
            "2   B           second\n"
            "1   王小明的组  first\n");
  EXPECT_EQ(shown("group show B"),
            "Name         B\n"
            "Id           2\n"
            "Description  second\n"
            "Roles\n"
            "\n"
            "Login  Name  Department\n");
}

}  // namespace
}  // namespace QVSa::console
