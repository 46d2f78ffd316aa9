#include <algorithm>
#include <cstdlib>
#include <filesystem>
#include <gtest/gtest.h>
#include <map>
#include <set>

#include "QVSa/QVSa.h"
#include "console/OrganisationFiles.h"
#include "tests/support/PlainSession.h"
#include "tests/support/TestInstallation.h"

namespace QVSa {
namespace {

using console::HoldingRow;
using console::Organisation;
using test::Lines;

void require(bool done, const String& what) {
  if (!done) throw std::runtime_error(what);
}

// Where the files of a real organisation lie, if they do.
const std::filesystem::path besideTheProject =
    std::filesystem::path(QVSA_SOURCE_DIR) / ".." / "shared" / "organisation";

enum class Origin { real, madeUp };

Organisation readFiles(Origin origin) {
  if (origin == Origin::real) return console::readOrganisation(besideTheProject);
  const test::TestFolder folder;
  require(std::system((String(QVSA_MADE_UP_ORGANISATION) + " '" + folder.path().string() + "'").c_str()) == 0,
          "no organisation could be made up");
  return console::readOrganisation(folder.path());
}

// The organisation brought into an installation by the public classes, and what the files themselves say of it.
class Ground {
 public:
  explicit Ground(Origin origin) : files(readFiles(origin)) {
    addDepartments();
    addUsers();
    addHoldings();
  }

  template <class Object>
  Object connected() const {
    Object object;
    object.connect(installation_.server(), "QVApp");
    return object;
  }
  test::PlainSession tables() const { return test::PlainSession(installation_.server()); }

  // From the department up to the root.
  Lines wayUp(String number) const {
    Lines result;
    for (; !number.empty(); number = superior.at(number)) result.push_back(number);
    return result;
  }
  std::size_t level(const String& number) const { return wayUp(number).size(); }
  String path(const String& number) const {
    String result = ".";
    for (const String& step : wayUp(number)) result = "." + id.at(step) + result;
    return result;
  }
  String organisationOf(const String& number) const {
    for (const String& step : wayUp(number))
      if (organisations.count(step) != 0) return step;
    return "_root";
  }
  bool isBelow(const String& number, const String& top) const {
    const Lines way = wayUp(number);
    return std::find(way.begin(), way.end(), top) != way.end();
  }

  Organisation files;
  std::map<String, String> superior;
  std::map<String, String> id;
  std::set<String> organisations;
  std::map<String, String> userId;

 private:
  void addDepartments() {
    for (const auto& row : files.departments) {
      auto department = connected<Department>();
      if (row.number == "_root") department.GetOne(1, "_root");
      department.Id(row.number);
      department.Name(row.name);
      department.Super(row.superior);
      department.isOrg(row.isOrganisation);
      require(department.Save(), department.errDescription());
      superior[row.number] = row.superior;
      id[row.number] = text(department.InnerId());
      if (row.isOrganisation) organisations.insert(row.number);
    }
  }

  // Past User.Save, whose encryption is not what these tests are about.
  void addUsers() {
    const test::PlainSession session = tables();
    for (const auto& row : files.users)
      session.run("insert into users(userName,userLogin,deptId) values('" + row.name + "','" + row.login + "'," +
                  id.at(row.department) + ")");
    for (const String& line : session.rows("select userLogin,userId from users")) {
      const std::size_t mark = line.find('|');
      userId[line.substr(0, mark)] = line.substr(mark + 1);
    }
  }

  void addHoldings() {
    std::map<String, std::map<String, Lines>> holders;
    for (const HoldingRow& row : files.holdings) holders[row.role][row.department].push_back(row.login);
    for (const auto& [name, departments] : holders) addHolders(name, departments);
  }

  void addHolders(const String& roleName, const std::map<String, Lines>& departments) {
    auto role = connected<Role>();
    role.Name(roleName);
    Lines ids;
    for (const auto& [number, logins] : departments) ids.push_back(id.at(number));
    require(role.Save() && role.setJobs(join(ids, ",")), role.errDescription());
    Lines pairs;
    for (const auto& [number, logins] : departments) {
      const String jobId = text(role.GetJobIdOfTheDept(id.at(number)));
      for (const String& login : logins) pairs.push_back(userId.at(login) + "," + jobId);
    }
    require(role.UpdateUsers(join(pairs, "|"), ""), role.errDescription());
  }

  test::TestInstallation installation_;
};

class WholeOrganisation : public testing::TestWithParam<Origin> {
 protected:
  void SetUp() override {
    if (GetParam() == Origin::real && !std::filesystem::exists(besideTheProject / "departments.csv"))
      GTEST_SKIP() << "No organisation lies beside the project.";
  }
  static const Ground& ground() {
    static std::map<Origin, Ground> grounds;
    return grounds.try_emplace(GetParam(), GetParam()).first->second;
  }

  // The department with the most users at or below it, the root left out.
  static String largest() {
    std::map<String, int> size;
    for (const auto& user : ground().files.users)
      for (const String& number : ground().wayUp(user.department)) ++size[number];
    size.erase("_root");
    return std::max_element(size.begin(), size.end(), [](const auto& a, const auto& b) { return a.second < b.second; })
        ->first;
  }
  // The deepest department in which somebody holds a role.
  static HoldingRow deepestHolding() {
    const auto& holdings = ground().files.holdings;
    return *std::max_element(holdings.begin(), holdings.end(), [](const HoldingRow& a, const HoldingRow& b) {
      return ground().level(a.department) < ground().level(b.department);
    });
  }
  static Lines sorted(Lines lines) {
    std::sort(lines.begin(), lines.end());
    return lines;
  }
};

INSTANTIATE_TEST_SUITE_P(Organisations, WholeOrganisation, testing::Values(Origin::real, Origin::madeUp),
                         [](const auto& origin) { return origin.param == Origin::real ? "Real" : "MadeUp"; });

TEST_P(WholeOrganisation, EveryDepartmentHasItsLevelItsPathAndItsOrganisation) {
  Lines tree, organisations;
  for (const auto& [number, id] : ground().id) {
    tree.push_back(number + "|" + std::to_string(ground().level(number)) + "|" + ground().path(number));
    const String organisation = ground().organisationOf(number);
    organisations.push_back(number + "|" + ground().id.at(organisation) + "|" + organisation);
  }
  EXPECT_EQ(sorted(ground().tables().rows("select deptNo,l,path from QV_v_Dept where deptNo<>'_out'")), sorted(tree));
  EXPECT_EQ(sorted(ground().tables().rows("select d.deptNo,o.orgId,o.orgno from departments d,QV_v_DeptOrg_1 o"
                                          " where d.deptId=o.deptId and d.deptNo<>'_out'")),
            sorted(organisations));
}

TEST_P(WholeOrganisation, TheTreeComesByPathWithEachDepartmentBehindThoseAboveItOrByLevel) {
  auto tree = ground().connected<Departments>();
  ASSERT_TRUE(tree.GetAll(0)) << tree.errDescription();
  EXPECT_EQ(static_cast<std::size_t>(tree.Count()), ground().id.size());
  std::set<String> seen{""};
  for (const auto& department : tree) {
    EXPECT_EQ(department->Super(), ground().superior.at(department->Id()));
    EXPECT_EQ(department->fullId(), ground().path(department->Id()));
    EXPECT_EQ(seen.count(department->Super()), 1U) << department->Id();
    seen.insert(department->Id());
  }
  ASSERT_TRUE(tree.GetAllWithLevel(0));
  std::size_t level = 1;
  for (const auto& department : tree) {
    EXPECT_GE(ground().level(department->Id()), level);
    level = ground().level(department->Id());
  }
  EXPECT_EQ(static_cast<std::size_t>(tree.Count()), ground().id.size());
}

TEST_P(WholeOrganisation, ASubtreeHoldsItsDepartmentsUsersAndJobsAndNoOthers) {
  const String top = largest();
  Lines departments, users;
  std::set<String> jobs;
  for (const auto& [number, id] : ground().id)
    if (ground().isBelow(number, top)) departments.push_back(number);
  for (const auto& user : ground().files.users)
    if (ground().isBelow(user.department, top)) users.push_back(user.name);
  for (const HoldingRow& row : ground().files.holdings)
    if (ground().isBelow(row.department, top)) jobs.insert(row.role + " " + row.department);

  Lines found;
  auto tree = ground().connected<Departments>();
  ASSERT_TRUE(tree.GetAll(-1, ground().id.at(top)));
  for (const auto& department : tree) found.push_back(department->Id());
  EXPECT_EQ(sorted(found), sorted(departments));

  const Long topId = Variant(ground().id.at(top)).toLong();
  auto people = ground().connected<Users>();
  ASSERT_TRUE(people.GetAllOfTheDept(topId));
  found.clear();
  for (const auto& user : people) found.push_back(user->Name());
  EXPECT_EQ(found, sorted(users));
  EXPECT_EQ(static_cast<std::size_t>(people.GetList(topId)), users.size());

  auto held = ground().connected<Jobs>();
  ASSERT_TRUE(held.GetAllOfDept(topId));
  std::set<String> foundJobs;
  for (const auto& job : held) foundJobs.insert(job->roleName() + " " + job->deptId());
  EXPECT_EQ(foundJobs, jobs);
}

TEST_P(WholeOrganisation, AChainAboveJobsIsTheirWaysUpEachDepartmentOnceByLevel) {
  std::set<String> expected;
  Lines jobIds;
  for (std::size_t i = 0; i < ground().files.holdings.size() && jobIds.size() < 100; i += 60) {
    const HoldingRow& row = ground().files.holdings[i];
    auto role = ground().connected<Role>();
    ASSERT_TRUE(role.GetOne(2, row.role));
    jobIds.push_back(text(role.GetJobIdOfTheDept(ground().id.at(row.department))));
    for (const String& number : ground().wayUp(row.department)) expected.insert(number);
  }
  auto chain = ground().connected<Departments>();
  ASSERT_TRUE(chain.getAllSuperWithLevel(join(jobIds, ","))) << chain.errDescription();
  std::set<String> found;
  std::size_t level = 1;
  for (const auto& department : chain) {
    EXPECT_GE(ground().level(department->Id()), level);
    level = ground().level(department->Id());
    found.insert(department->Id());
  }
  EXPECT_EQ(found, expected);
  EXPECT_EQ(static_cast<std::size_t>(chain.Count()), expected.size());
}

TEST_P(WholeOrganisation, AChainWithinAnOrganisationStopsAtItsTop) {
  const HoldingRow deepest = deepestHolding();
  const String organisation = ground().organisationOf(deepest.department);
  auto role = ground().connected<Role>();
  ASSERT_TRUE(role.GetOne(2, deepest.role));
  const String jobId = text(role.GetJobIdOfTheDept(ground().id.at(deepest.department)));
  Lines expected = ground().wayUp(deepest.department);
  std::erase_if(expected, [&](const String& number) { return ground().organisationOf(number) != organisation; });
  std::reverse(expected.begin(), expected.end());
  auto chain = ground().connected<Departments>();
  ASSERT_TRUE(chain.getAllSuperWithLevel(jobId, 1, organisation)) << chain.errDescription();
  Lines found;
  for (const auto& department : chain) found.push_back(department->Id());
  EXPECT_EQ(found, expected);
  ASSERT_TRUE(chain.getAllSuperWithLevel(jobId, 2, ground().id.at(deepest.department), 0));
  ASSERT_EQ(chain.Count(), 1);
  EXPECT_EQ(chain.Item(Long{1})->Id(), deepest.department);
}

TEST_P(WholeOrganisation, HoldersAndCandidatesAreThoseOfTheFiles) {
  const HoldingRow deepest = deepestHolding();
  std::set<String> holders, ofOneJob;
  for (const HoldingRow& row : ground().files.holdings) {
    if (row.role != deepest.role) continue;
    holders.insert(ground().userId.at(row.login));
    if (row.department == deepest.department) ofOneJob.insert(ground().userId.at(row.login));
  }
  const auto ids = [](const Users& users) {
    std::set<String> result;
    for (const auto& user : users) result.insert(text(user->Id()));
    return result;
  };
  auto role = ground().connected<Role>();
  ASSERT_TRUE(role.GetOne(2, deepest.role));
  EXPECT_EQ(ids(*role.GetUsers()), holders);
  EXPECT_EQ(ids(*role.GetUsersOfRole("", deepest.role)), holders);
  auto picker = ground().connected<Users>();
  ASSERT_TRUE(picker.getAllForSelUser(text(role.GetJobIdOfTheDept(ground().id.at(deepest.department)))));
  EXPECT_EQ(ids(picker), ofOneJob);

  const auto& me = ground().files.users.front();
  const String myOrganisation = ground().organisationOf(me.department);
  std::set<String> colleagues;
  for (const auto& user : ground().files.users)
    if (ground().organisationOf(user.department) == myOrganisation) colleagues.insert(ground().userId.at(user.login));
  if (myOrganisation == "_root") colleagues.insert("1");
  ASSERT_TRUE(picker.getAllForSelUser("", Variant(ground().userId.at(me.login)).toLong(), 1));
  EXPECT_EQ(ids(picker), colleagues);
}

}  // namespace
}  // namespace QVSa
