#include "console/OrganisationFiles.h"

#include <libfccp/csv.h>
#include <set>
#include <tuple>

#include "console/Answer.h"

namespace QVSa::console {

namespace {

template <unsigned columns>
using Reader = io::CSVReader<columns, io::trim_chars<' ', '\t', '\r'>, io::double_quote_escape<',', '"'>>;

[[noreturn]] void refuse(const std::filesystem::path& file, unsigned line, const String& what) {
  throw Refusal(file.filename().string() + ", line " + std::to_string(line) + ": " + what + ".");
}

using Keys = std::set<String>;

void claim(Keys& keys, const String& key, const String& noun, const std::filesystem::path& file, unsigned line) {
  if (key.empty()) refuse(file, line, "the " + noun + " is empty");
  if (!keys.insert(key).second) refuse(file, line, "the " + noun + " " + key + " stands there twice");
}

bool flagOf(const String& text, const std::filesystem::path& file, unsigned line) {
  if (text != "0" && text != "1") refuse(file, line, "isOrganisation is " + text + ", not 0 or 1");
  return text == "1";
}

std::vector<DepartmentRow> readDepartments(const std::filesystem::path& file, Keys& numbers) {
  Reader<4> reader(file.string());
  reader.read_header(io::ignore_no_column, "number", "name", "superior", "isOrganisation");
  std::vector<DepartmentRow> rows;
  DepartmentRow row;
  String flag;
  while (reader.read_row(row.number, row.name, row.superior, flag)) {
    const unsigned line = reader.get_file_line();
    const bool isRoot = row.number == "_root";
    if (isRoot != rows.empty()) refuse(file, line, "_root must be the first department");
    if (row.name.empty()) refuse(file, line, "the name is empty");
    if (isRoot ? !row.superior.empty() : numbers.count(row.superior) == 0)
      refuse(file, line,
             "the superior " + row.superior + (isRoot ? " stands above _root" : " stands in no earlier line"));
    claim(numbers, row.number, "number", file, line);
    row.isOrganisation = flagOf(flag, file, line);
    rows.push_back(row);
  }
  return rows;
}

std::vector<UserRow> readUsers(const std::filesystem::path& file, const Keys& departments, Keys& logins) {
  Reader<3> reader(file.string());
  reader.read_header(io::ignore_no_column, "login", "name", "department");
  std::vector<UserRow> rows;
  UserRow row;
  while (reader.read_row(row.login, row.name, row.department)) {
    const unsigned line = reader.get_file_line();
    claim(logins, row.login, "login", file, line);
    if (row.name.empty()) refuse(file, line, "the name is empty");
    if (departments.count(row.department) == 0) refuse(file, line, "there is no department " + row.department);
    rows.push_back(row);
  }
  return rows;
}

std::vector<HoldingRow> readHoldings(const std::filesystem::path& file, const Keys& departments, const Keys& logins) {
  if (!std::filesystem::exists(file)) return {};
  Reader<3> reader(file.string());
  reader.read_header(io::ignore_no_column, "login", "role", "department");
  std::vector<HoldingRow> rows;
  std::set<std::tuple<String, String, String>> seen;
  HoldingRow row;
  while (reader.read_row(row.login, row.role, row.department)) {
    const unsigned line = reader.get_file_line();
    if (row.role.empty()) refuse(file, line, "the role is empty");
    if (logins.count(row.login) == 0) refuse(file, line, "there is no user " + row.login);
    if (departments.count(row.department) == 0) refuse(file, line, "there is no department " + row.department);
    if (!seen.emplace(row.login, row.role, row.department).second) refuse(file, line, "the holding stands there twice");
    rows.push_back(row);
  }
  return rows;
}

}  // namespace

Organisation readOrganisation(const std::filesystem::path& folder) {
  try {
    Organisation organisation;
    Keys numbers, logins;
    organisation.departments = readDepartments(folder / "departments.csv", numbers);
    organisation.users = readUsers(folder / "users.csv", numbers, logins);
    organisation.holdings = readHoldings(folder / "holdings.csv", numbers, logins);
    return organisation;
  } catch (const io::error::base& error) {
    throw Refusal(error.what());
  }
}

}  // namespace QVSa::console
