#pragma once

#include "QVSa/frame/Frame.h"

namespace QVSa {

// A named set of users that receives roles as a whole, without regard to departments.
//   userGroup group;  group.connect(server);
//   group.Name("Auditors");  group.Save();  group.SetUsers("3,7");  group.SetRoles("Report Owners");
class QVSA_EXPORT userGroup : private Frame {
 public:
  using Frame::connect;
  using Frame::errDescription;
  using Frame::errNumber;

  // What GetOne finds a group by.
  enum Key : Integer { byId = 1, byName = 2 };

  // 0 for a new group; its members and roles are then those of nobody's group 0.
  Long Id() const { return Id_; }
  String Name() const { return Name_; }
  void Name(String value) { Name_ = std::move(value); }
  String description() const { return description_; }
  void description(String value) { description_ = std::move(value); }

  // The members of group `Id` (0: this one), as XML: <users><user id name deptFullName/>...</users>; deptFullName holds
  // the department's short name. The empty text for a group without members.
  String GetUsers(Long Id = 0);
  // Replaces the members: user ids, comma-separated; ids of nobody are passed over.
  Boolean SetUsers(const String& userList);
  // The names of the group's roles, comma-separated, in no order.
  Boolean GetRoles(String& roleList);
  // Replaces the roles, in the form that GetRoles gives: a name that holds a comma can't be set.
  Boolean SetRoles(const String& roleList);

  // Loads by a Key; any other `keyName` finds none. groupUnknown (0x8004070D) where there is no such group.
  Boolean GetOne(Integer keyName, const Variant& keyValue);
  // Deletes group `Id` (0: this one) with its members and roles; an unknown one gives True.
  Boolean Delete(Long Id = 0);
  // Inserts or updates the group. groupIncomplete (0x80040708) name empty, groupExists (0x80040709) name taken by
  // another group.
  Boolean Save();

 private:
  Boolean insertGroup();
  Boolean updateGroup();

  Long Id_ = 0;
  String Name_;
  String description_;
};

}  // namespace QVSa
