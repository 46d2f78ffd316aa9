#include <thread>

#include "providers/embedded/storage/Pool.h"
#include "tests/database/Shipped.h"
#include "tests/support/Failures.h"

namespace QVSa::test {
namespace {

using embedded::Handle;

// An installation as the layout before has it: made from today's by taking back what has come since.
class OldInstallation : public FilesScene {
 protected:
  void SetUp() override {
    FilesScene::SetUp();
    if (IsSkipped()) return;
    for (const char* batch :
         {"drop index departments_isOrg on departments", "drop view QV_v_JobDeptPathWithLevel",
          "create view QV_v_JobDeptPathWithLevel as "
          "with chain (jobid, deptid, x, pathDeptId, superDeptId, l) as ("
          " select j.jobId, j.deptId, 0, d.deptId, d.superDept, d.l"
          " from jobs j inner join QV_v_Dept d on d.deptId = j.deptId"
          " union all"
          " select c.jobid, c.deptid, 1, s.deptId, s.superDept, c.l - 1"
          " from chain c inner join departments s on s.deptId = c.superDeptId) "
          "select c.jobid, c.deptid, c.x, c.pathDeptId, d.deptName as pathDeptName, c.superDeptId, d.fullName, d.path,"
          " d.deptNo, c.l from chain c inner join departments d on d.deptId = c.pathDeptId",
          "insert into departments(deptNo,deptName,superDept,fullName,path) values('S','Sales',1,'Sales','.1.3.')"})
      system_.run(batch);
    Handle handle(folder());
    for (const std::string name : embedded::databaseNames)
      handle.execute("update " + name + ".engine set layout=1; pragma " + name + ".user_version=0");
    embedded::discardIdleHandle(folder());
  }

  const std::filesystem::path& folder() const { return installation_.folder(); }

  static Lines read(Handle& handle, const std::string& query) {
    Lines lines;
    embedded::Prepared rows(handle.get(), query);
    while (rows.step()) lines.push_back(reinterpret_cast<const char*>(sqlite3_column_text(rows.get(), 0)));
    return lines;
  }

  // All that the layout is about, in all four files.
  static Lines shape(const std::filesystem::path& folder) {
    Handle handle(folder);
    Lines lines;
    for (const std::string name : embedded::databaseNames)
      for (const std::string& query : {"select layout from " + name + ".engine", "pragma " + name + ".user_version",
                                       "select text from " + name + ".definitions order by name",
                                       "select name||coalesce(sql,'') from " + name + ".sqlite_schema order by name"})
        for (const String& line : read(handle, query)) lines.push_back(name + ": " + line);
    return lines;
  }

  PlainSession system_{installation_.server(), "QVSys"};
};

TEST_F(OldInstallation, IsUpgradedByWhoOpensItOnceTheOthersHaveLeft) {
  Handle user(folder());
  ASSERT_TRUE(user.locks(1).tryEnter());
  std::vector<std::thread> opening;
  for (int i = 0; i < 4; ++i)
    opening.emplace_back([&] { EXPECT_TRUE(embedded::acquireHandle(folder())->isUpToDate()); });
  std::this_thread::sleep_for(std::chrono::milliseconds(50));
  EXPECT_EQ(user.layout(1), 1);
  user.locks(1).leave();
  for (auto& thread : opening) thread.join();
  EXPECT_EQ(shape(folder()), shape(TestInstallation().folder()));
  EXPECT_EQ(system_.text("select deptName from departments where deptNo='S'"), "Sales");
  EXPECT_EQ(system_.text("select distinct pathDeptId,l from QV_v_JobDeptPathWithLevel"), "1|1");
}

TEST_F(OldInstallation, StaysAsItIsWhereAStepFails) {
  Handle(folder()).execute("delete from QVSys.definitions where name='qv_v_jobdeptpath'");
  const Failure failure = thrownBy([&] { system_.text("select 1"); });
  EXPECT_EQ(failure.native(), 4060);
  EXPECT_NE(failure.description().find("its upgrade failed: Cannot drop the view 'QV_v_JobDeptPath'"), String::npos)
      << failure.description();
  EXPECT_EQ(Handle(folder()).layout(1), 1);
  EXPECT_EQ(PlainSession(installation_.server(), "master").text("select 1"), "1") << "a backup still gets in";
}

TEST_F(OldInstallation, IsUpgradedWhereACopyOfItIsRestored) {
  const TestFolder files;
  const std::string copy = (files.path() / "old").string();
  Handle(folder()).execute("vacuum QVSys into '" + copy + "'");
  const TestInstallation other;
  const auto before = shape(other.folder());
  Connection administrator;
  administrator.Open(other.administratorString("master"));
  administrator.Execute("restore database QVSys from disk='" + copy + "' with replace");
  EXPECT_EQ(administrator.Execute("select deptName from QVSys..departments where deptNo='S'")[0].asText(), "Sales");
  administrator.Close();
  EXPECT_EQ(shape(other.folder()), before);
}

}  // namespace
}  // namespace QVSa::test
