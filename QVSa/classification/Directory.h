#pragma once

#include "QVSa/frame/Frame.h"

namespace QVSa {

// A node of the tree of report classes, and the operations on the whole tree.
//   Directory node;  node.connect(server);
//   node.Class("Invoices");  node.superClass("Sales");  node.Save();
// Each row holds its ancestry three times: as a path, ".Sales.Invoices.", as a full name, "Sales,Invoices", and as a
// text that sorts, the ordPath "002.001". A save keeps paths and full names true in all that lies below; the ordPath
// more than one level down can be that of before.
class QVSA_EXPORT Directory : private Frame {
 public:
  using Frame::connect;
  using Frame::errDescription;
  using Frame::errNumber;

  // The place among the siblings, from 1, as it was loaded. A save works the new one out and does not show it here; set
  // to 0, the siblings behind the old place do not move up.
  Integer ordNo() const { return ordNo_; }
  void ordNo(Integer value) { ordNo_ = value; }
  String ordPath() const { return ordPath_; }
  void ordPath(String value) { ordPath_ = std::move(value); }
  // The name, which is the key.
  String Class() const { return Class_; }
  void Class(String value) { Class_ = std::move(value); }
  // The name of the node above; empty: none.
  String superClass() const { return superClass_; }
  void superClass(String value) { superClass_ = std::move(value); }
  String fullName() const { return fullName_; }
  void fullName(String value) { fullName_ = std::move(value); }
  // Who made and who last changed the node, and when. The caller sets them all; a save writes them as they stand.
  Long creUserId() const { return creUserId_; }
  void creUserId(Long value) { creUserId_ = value; }
  String creUserName() const { return creUserName_; }
  void creUserName(String value) { creUserName_ = std::move(value); }
  Date createTime() const { return createTime_; }
  void createTime(Date value) { createTime_ = value; }
  Long updUserId() const { return updUserId_; }
  void updUserId(Long value) { updUserId_ = value; }
  String upduserName() const { return upduserName_; }
  void upduserName(String value) { upduserName_ = std::move(value); }
  Date updTime() const { return updTime_; }
  void updTime(Date value) { updTime_ = value; }
  // Whether others than the maker may design reports in this class.
  Boolean otherCanDesign() const { return otherCanDesign_; }
  void otherCanDesign(Boolean value) { otherCanDesign_ = value; }

  // The tree as <ds><d super=".." path=".." ...>name</d>...</ds>, flat, every node behind the one above it. `SuperDir`:
  // empty, the whole tree; blank, the roots; else the nodes directly below that one. The empty text on failure.
  String GetAll(const String& SuperDir = "");
  // Loads the node of that name, whatever `keyName`. True also where there is none: the properties then stay.
  Boolean GetOne(Integer keyName, const Variant& keyValue);
  // Inserts the node as the last of its siblings, or updates the one that was loaded or saved here. An update rewrites
  // what lies below, in one transaction, and makes the node the last of its siblings, whatever has changed; call
  // updateSubOrder to put it elsewhere. classUnknown (0x80040578) a new node's superior, or the node to be renamed or
  // moved, is not there; 0x80040E2F the name is taken; 5 there are 999 siblings already; 0x80040E57 too deep: a path
  // has room for 850 characters, a full name for 4,000, an ordPath for 400, which is 100 levels.
  Boolean Save();
  // Deletes the node `Class` (empty: this one). What lies below stays, cut off from what was above. classUnknown
  // (0x80040578) there is no such node.
  Boolean Delete(const String& Class = "");
  // Numbers the nodes named in `SubDirs`, "," between, in that order. `SuperOrdPath`: the ordPath above them with a
  // trailing ".", empty for roots. Not one transaction: a failure, as 5 at the thousandth name, leaves those before it
  // renumbered.
  Boolean updateSubOrder(const String& SuperOrdPath, const String& SubDirs);

 private:
  struct Ancestry;
  struct Place;

  void read(Recordset& row);
  Boolean InsertDir();
  Boolean UpdateDir();
  static Ancestry readAncestry(Recordset& row);
  Place placeBelow(const Ancestry& superior) const;
  Long nextPosition(Connection& connection);
  void fill(SqlText& statement, const Place& place) const;
  void insertRow(Connection& connection, const Place& place);
  void updateRow(Connection& connection, const Place& place);
  void rewriteBelow(Connection& connection, const Ancestry& stored, const Place& place);

  static String threeDigits(Long position);
  void reorderBelow(Connection& connection, const String& name);
  void closeGap(Connection& connection);

  Integer ordNo_ = 0;
  String ordPath_;
  String Class_;
  String superClass_;
  String fullName_;
  Long creUserId_ = 0;
  String creUserName_;
  Date createTime_;
  Long updUserId_ = 0;
  String upduserName_;
  Date updTime_;
  Boolean otherCanDesign_ = false;
  String path_;
  String oldClass_;  // name and superior under which the row is stored
  String oldSuperClass_;
};

}  // namespace QVSa
