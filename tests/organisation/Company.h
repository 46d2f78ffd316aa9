#pragma once

#include "tests/support/Scene.h"

namespace QVSa::test {

// A small company on the engine. _root over Sales (S, an organisation) over East (E) over Hub (H), and over Works (W);
// the role Manager.
class Company : public Scene {
 protected:
  Company() {
    for (const auto& [number, name, superior] :
         {std::array{"S", "Sales", "_root"}, {"E", "East", "S"}, {"H", "Hub", "E"}, {"W", "Works", "_root"}})
      addDepartment(number, name, superior);
    manager_ = addRole("Manager");
  }

  Department department(const String& number) {
    auto result = connected<Department>();
    EXPECT_TRUE(result.GetOne(1, number)) << result.errDescription();
    return result;
  }
  String idOf(const String& number) { return text(department(number).InnerId()); }

  void addDepartment(const String& number, const String& name, const String& superior) {
    auto added = connected<Department>();
    added.Id(number);
    added.Name(name);
    added.Super(superior);
    added.isOrg(number == "S");
    ASSERT_TRUE(added.Save()) << added.errDescription();
  }

  Role addRole(const String& name) {
    auto role = connected<Role>();
    role.Name(name);
    EXPECT_TRUE(role.Save()) << role.errDescription();
    return role;
  }

  // The job of the role in a department, made where it is missing.
  Long job(Role& role, const String& number) {
    EXPECT_TRUE(role.setJobs(idOf(number))) << role.errDescription();
    return role.GetJobIdOfTheDept(idOf(number));
  }

  Long addUser(const String& name, const String& number, const String& jobs = "") {
    auto user = connected<User>();
    user.Name(name);
    user.Login(name);
    user.Pwd("secret");
    user.setDept(department(number));
    user.setJobs(jobs);
    EXPECT_TRUE(user.Save()) << user.errDescription();
    return user.Id();
  }

  userGroup addGroup(const String& name, const String& members = "", const String& roles = "") {
    auto group = connected<userGroup>();
    group.Name(name);
    EXPECT_TRUE(group.Save() && group.SetUsers(members) && group.SetRoles(roles)) << group.errDescription();
    return group;
  }

  Role manager_;
};

// The items of a list, in order, each as `describe` tells it.
template <class List, class Describe>
Lines listed(const List& list, Describe describe) {
  Lines result;
  for (const auto& item : list) result.push_back(describe(*item));
  return result;
}

template <class List>
Lines names(const List& list) {
  return listed(list, [](const auto& item) { return item.Name(); });
}

}  // namespace QVSa::test
