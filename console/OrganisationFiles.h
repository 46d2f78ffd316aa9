#pragma once

#include <filesystem>
#include <vector>

#include "QVSa/values/Values.h"

namespace QVSa::console {

// An organisation as its files tell it, in UTF-8 with a heading line, values in quotes where they hold a comma:
//   departments.csv  number,name,superior,isOrganisation   superiors before their departments, `_root` first, 1 or 0
//   users.csv        login,name,department                 the number of the home department
//   holdings.csv     login,role,department                 who holds which role where; the file may be missing
struct DepartmentRow {
  String number;
  String name;
  String superior;  // empty for `_root`
  bool isOrganisation = false;
};

struct UserRow {
  String login;
  String name;
  String department;
};

struct HoldingRow {
  String login;
  String role;
  String department;
};

struct Organisation {
  std::vector<DepartmentRow> departments;
  std::vector<UserRow> users;
  std::vector<HoldingRow> holdings;
};

// Reads the files of a folder and checks that they fit together. Throws Refusal with the file, the line and what is
// wrong there: a missing file or column, an empty or repeated number, login or holding, a superior, department or
// login that no earlier row has.
Organisation readOrganisation(const std::filesystem::path& folder);

}  // namespace QVSa::console
