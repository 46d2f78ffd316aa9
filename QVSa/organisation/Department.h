#pragma once

#include <optional>

#include "QVSa/frame/Frame.h"

namespace QVSa {

class Departments;
class Users;

// One row of the department tree.
//   Department sales;  sales.connect(server);
//   sales.Id("S1");  sales.Name("Sales");  sales.Super("_root");  sales.Save();
// A department has two identities: its number (`Id`, the caller's) and its inner id (the database's).
class QVSA_EXPORT Department : private Frame {
 public:
  using Frame::connect;
  using Frame::errDescription;
  using Frame::errNumber;

  // What GetOne finds a department by.
  enum Key : Integer { byInnerId = 0, byNumber = 1, byName = 2 };

  // A department of outside users. Written by the first save only.
  Boolean isOuter() const { return isOuter_; }
  void isOuter(Boolean value) { isOuter_ = value; }
  // The department number. `_root` and `_out` are reserved.
  String Id() const { return Id_; }
  void Id(String value) { Id_ = std::move(value); }
  // 0 while the row is not in the table.
  Long InnerId() const { return InnerId_; }
  String Name() const { return Name_; }
  void Name(String value) { Name_ = std::move(value); }
  // Number of the superior department; empty: none.
  String Super() const { return Super_; }
  void Super(String value) { Super_ = std::move(value); }
  Long superInnerId() const { return superInnerId_; }
  // The names from below the root down, with "-" between: "Sales-East". Worked out by every save.
  String fullName() const { return fullName_; }
  void fullName(String value) { fullName_ = std::move(value); }
  // Whether the department is an organisation: a company or branch inside the tree.
  Boolean isOrg() const { return isOrg_ == 1; }
  void isOrg(Boolean value) { isOrg_ = value ? 1 : 0; }
  // Number of the organisation that the department belongs to, found by GetOne: itself, or the nearest above.
  String Org() const { return Org_; }
  // The inner ids from the top down, a dot around each: ".1.3.7.". Filled by GetOne; empty after an insert.
  String fullId() const { return fullId_; }
  void fullId(String value) { fullId_ = std::move(value); }

  // Loads by a Key; any other `keyName` is byInnerId. departmentUnknown (0x800403E9) where there is none.
  Boolean GetOne(Integer keyName, const String& keyValue);
  // Inserts the department, or updates it where `InnerId` is not 0; a change of place or name rewrites the paths and
  // full names of all below it, in the same transaction. A place inside its own subtree is not refused.
  // departmentIncomplete (0x800403EA) number or name empty, superiorUnknown (0x800403EB) no such superior, 0x80040E57
  // too deep: a path has room for 850 characters, 121 levels where the inner ids have six digits, and a full name for
  // 4,000. An insert is not one transaction: where it fails behind its first statement, the row is there without a
  // path. With `InnerId` set, another Save gives it one and changes no other row; with 0, delete it by its number
  // first.
  Boolean Save();
  // Deletes the department numbered `Id` (empty: this one) and its jobs. departmentUnknown (0x800403E9) there is none,
  // departmentHasChildren (0x800403EC) it has sub departments, departmentHasUsers (0x800403EE) it has users. Not one
  // transaction: the jobs stay removed where the last step fails.
  Boolean Delete(const String& Id = "");

  // This department and all below it, in no order, each under its number. The result is not connected: its records
  // can't reach the database. No object on failure.
  std::shared_ptr<Departments> GetAllSub();
  // An empty collection where nothing lies directly below; no object and 13 where something does. Use GetAllSub.
  std::shared_ptr<Departments> GetSub();
  // The users of the department whose number reads as this one's inner id: not this one's users, unless number and
  // inner id are the same. No object on failure.
  std::shared_ptr<Users> GetUsers();

 private:
  friend class Departments;

  struct Place;
  struct Superior;
  struct Stored;

  void read(Recordset& row);
  void findOrganisation(Connection& connection, const String& myPath);

  Boolean insertDept();
  void requireRoomBelow(const String& path) const;
  Boolean updateDept();
  std::optional<Superior> findSuper(Connection& connection);
  Stored readStored(Connection& connection);
  std::optional<Place> locate(Connection& connection, const Stored& stored);
  void updateRow(Connection& connection, const Place& place);
  void rewriteSubtree(Connection& connection, const Stored& stored, const Place& place);

  Boolean isOuter_ = false;
  String Id_;
  Long InnerId_ = 0;
  String Name_;
  String Super_;
  Long superInnerId_ = 0;
  String fullName_;
  Integer isOrg_ = 0;
  String Org_;
  String fullId_;
};

}  // namespace QVSa
