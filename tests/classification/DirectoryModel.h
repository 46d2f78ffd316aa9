#pragma once

#include <map>
#include <optional>

#include "QVSa/values/Text.h"

namespace QVSa::test {

// The tree of classes as it has to stand after each operation, row by row and without a database. An operation gives
// False where it has to be refused; the rows are then those of before.
class DirectoryModel {
 public:
  struct Row {
    std::optional<String> superClass;
    String path;
    String fullName;
    std::optional<int> ordNo;
    std::optional<String> ordPath;
  };
  // An object's view of the row that it saves.
  struct Saved {
    String name;
    String superClass;
    String oldName;
    String oldSuperClass;
    int oldPlace = 0;
  };

  bool insert(const String& name, const String& superClass);
  bool update(const Saved& saved);
  bool remove(const String& name);
  bool reorder(const String& superOrdPath, const std::vector<String>& names);

  std::map<String, Row> rows;
  // One line a row, as a query gives them.
  std::vector<String> lines() const;

 private:
  struct Texts {
    String path;
    String fullName;
    std::optional<String> superOrdPath;  // nothing for a root
  };
  Texts textsOf(const String& name, const String& superClass) const;
  int countBelow(const String& superClass) const;
  void place(Row& row, const Texts& texts, int position) const;
  void rewrite(const Row& before, const String& path, const String& fullName);
  void reorderBelow(const String& name);
  bool fits() const;
};

}  // namespace QVSa::test
