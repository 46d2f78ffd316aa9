// A walk through an organisation with roles and their holders, each step with what the library returned.
//   organisation_walk SERVER LOGIN
// SERVER is the server text of an installation, LOGIN a user who holds a role in it. Ends with 1 where a step did not
// turn out as it should.

#include <cstdio>

#include "QVSa/QVSa.h"
#include "QVSa/frame/ConnectionString.h"
#include "Steps.h"

namespace {

using QVSa::Long;
using QVSa::String;

constexpr QVSa::Integer byName = 2;
constexpr int shownItems = 5;
const String database = "QVApp";

String counted(std::size_t count, const String& noun) { return std::to_string(count) + " " + noun; }

class Walk : private Steps {
 public:
  Walk(String server, String login) : Steps(std::move(server)), login_(std::move(login)) {}

  int walk() {
    meet();
    showHolders();
    showSubtree();
    showCandidates();
    showReach();
    showChain();
    return finish("The walk was gone to its end.");
  }

 private:
  template <class List, class Describe>
  void list(const String& call, bool done, const List& items, const String& noun, Describe describe) {
    const auto count = static_cast<std::size_t>(items.Count());
    line(call, done ? counted(count, noun) : items.errDescription(), done && count > 0);
    int shown = 0;
    for (const auto& item : items) {
      if (++shown > shownItems) break;
      std::printf("        %s\n", describe(*item).c_str());
    }
    if (count > shownItems) std::printf("        ...\n");
  }

  static String person(const QVSa::User& user) { return user.Name() + ", " + user.deptFullName(); }

  void meet() {
    title("Somebody who holds roles in departments");
    user_ = connected<QVSa::User>();
    line("User.GetOne(3, \"" + login_ + "\")", user_.errDescription(), user_.GetOne(QVSa::User::byLogin, login_));
    list("Jobs.GetAll of this user", jobs_.connect(server_, database) && jobs_.GetAll("", "", user_.Id()), jobs_,
         "jobs", [](const QVSa::Job& job) { return job.Name(); });
    role_ = connected<QVSa::Role>();
    if (jobs_.Count() > 0) role_.GetOne(byName, jobs_.Item(Long{1})->roleName());
  }

  void showHolders() {
    title("The holders of a role, as objects and as XML");
    const auto holders = role_.GetUsers();
    if (!holders) return line("Role.GetUsers of " + role_.Name(), role_.errDescription(), false);
    list("Role.GetUsers of " + role_.Name(), true, *holders, "users", person);
    String xml;
    const bool done = role_.GetUsers2(xml);
    line("Role.GetUsers2", done ? xml.substr(0, 96) + "..." : role_.errDescription(), done);
  }

  // The department directly below the root on the user's way up.
  QVSa::Department topOfUser() {
    auto top = connected<QVSa::Department>();
    top.GetOne(QVSa::Department::byNumber, user_.deptId());
    while (!top.Super().empty() && top.Super() != "_root") {
      const String superior = top.Super();
      top = connected<QVSa::Department>();
      top.GetOne(QVSa::Department::byNumber, superior);
    }
    return top;
  }

  void showSubtree() {
    title("A branch: its departments, and the users in it");
    auto top = topOfUser();
    auto tree = connected<QVSa::Departments>();
    list("Departments.GetAll below " + top.Id(), tree.GetAll(-1, std::to_string(top.InnerId())), tree, "departments",
         [](const QVSa::Department& department) { return department.fullName() + "  " + department.fullId(); });
    auto users = connected<QVSa::Users>();
    list("Users.GetAllOfTheDept", users.GetAllOfTheDept(top.InnerId()), users, "users", person);
    const Long rows = users.GetList(top.InnerId());
    line("Users.GetList, a row set that stands by itself", counted(static_cast<std::size_t>(rows), "rows"),
         rows == users.Count());
  }

  void showCandidates() {
    title("Whom a person picker offers");
    auto users = connected<QVSa::Users>();
    list("Users.getAllForSelUser, the user's organisation", users.getAllForSelUser("", user_.Id(), 1), users, "users",
         person);
    if (jobs_.Count() == 0) return;
    const auto job = jobs_.Item(Long{1});
    list("Users.getAllForSelUser, holders of " + job->Name(), users.getAllForSelUser(std::to_string(job->Id())), users,
         "users", person);
  }

  // Two reports and a task, in the place of the report server that keeps them.
  void bringReports() {
    QVSa::Connection connection;
    connection.Open(QVSa::buildConnString(server_, database, false));
    if (connection.Execute("select count(*) from reports where repId in (9001,9002)")[0].asLong() > 0) return;
    const String job = std::to_string(jobs_.Item(Long{1})->Id());
    connection.Execute(
        "insert into reports(repId,repName) values(9001,'Members & guests')"
        " insert into reports(repId,repName) values(9002,'Travel request')"
        " insert into repAcl(repId,jobId,authType) values(9001," +
        job +
        ",1)"
        " insert into repTmps(rtUid,repId) values('travel',9002) insert into cfprocesses(pId,rtUid) "
        "values(9001,'travel')"
        " insert into cftasks(tId,pId,tName) values(9001,9001,'Approve') insert into cftJob(tId,jobId) values(9001," +
        job + ")");
  }

  void showReach() {
    title("What the role reaches, once the report server has two reports for it");
    if (jobs_.Count() > 0) bringReports();
    const String acl = role_.getAcl();
    line("Role.getAcl", acl.empty() ? role_.errDescription() : acl, !acl.empty());
  }

  void showChain() {
    title("The chain above some jobs, by level; a list by name ends where a name comes again");
    std::vector<String> ids;
    for (const auto& job : jobs_)
      if (ids.size() < 20) ids.push_back(std::to_string(job->Id()));
    auto chain = connected<QVSa::Departments>();
    list("Departments.getAllSuperWithLevel, " + counted(ids.size(), "jobs"),
         chain.getAllSuperWithLevel(QVSa::join(ids, ",")), chain, "departments",
         [](const QVSa::Department& department) { return department.fullName(); });
  }

  String login_;
  QVSa::User user_;
  QVSa::Jobs jobs_;
  QVSa::Role role_;
};

}  // namespace

int main(int argc, char** argv) { return walkAs<Walk>("organisation_walk", argc, argv); }
