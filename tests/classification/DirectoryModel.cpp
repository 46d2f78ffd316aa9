#include "tests/classification/DirectoryModel.h"

namespace QVSa::test {

namespace {

String padded(int number) {
  const String digits = std::to_string(number);
  return String(3 - digits.size(), '0') + digits;
}

bool contains(const String& text, const String& part) { return text.find(part) != String::npos; }

}  // namespace

DirectoryModel::Texts DirectoryModel::textsOf(const String& name, const String& superClass) const {
  Texts texts{"." + name + ".", name, std::nullopt};
  if (superClass.empty()) return texts;
  texts.superOrdPath = "";
  const auto superior = rows.find(superClass);
  if (superior == rows.end()) return texts;
  texts.path = superior->second.path + name + ".";
  texts.fullName = superior->second.fullName + "," + name;
  texts.superOrdPath = superior->second.ordPath.value_or("");
  return texts;
}

int DirectoryModel::countBelow(const String& superClass) const {
  int count = 0;
  for (const auto& [name, row] : rows) count += row.superClass.value_or("") == superClass;
  return count;
}

// Below a node without an ordPath the order columns are left as they are.
void DirectoryModel::place(Row& row, const Texts& texts, int position) const {
  row.path = texts.path;
  row.fullName = texts.fullName;
  if (texts.superOrdPath && texts.superOrdPath->empty()) return;
  row.ordNo = position;
  row.ordPath = (texts.superOrdPath ? *texts.superOrdPath + "." : "") + padded(position);
}

bool DirectoryModel::insert(const String& name, const String& superClass) {
  if (rows.contains(name) || (!superClass.empty() && !rows.contains(superClass))) return false;
  Row row;
  row.superClass = superClass;
  place(row, textsOf(name, superClass), countBelow(superClass) + 1);
  rows[name] = row;
  return true;
}

bool DirectoryModel::update(const Saved& saved) {
  const DirectoryModel before = *this;
  const bool changed = saved.name != saved.oldName || saved.superClass != saved.oldSuperClass;
  const Texts texts = textsOf(saved.name, saved.superClass);
  const int position = countBelow(saved.superClass) + 1;
  const auto found = rows.find(saved.oldName);
  if (changed && found == rows.end()) return false;
  if (saved.name != saved.oldName && rows.contains(saved.name)) return false;

  if (found != rows.end()) {
    Row row = found->second;
    const Row old = row;
    row.superClass = saved.superClass;
    place(row, texts, position);
    rows.erase(found);
    rows[saved.name] = row;
    if (changed) rewrite(old, texts.path, texts.fullName);
  }
  reorderBelow(saved.name);
  if (saved.oldPlace > 0) {
    for (auto& [name, row] : rows) {
      if (row.superClass != saved.oldSuperClass || row.ordNo.value_or(0) <= saved.oldPlace) continue;
      const std::size_t digits = std::to_string(*row.ordNo).size();
      row.ordNo = *row.ordNo - 1;
      if (row.ordPath) row.ordPath = row.ordPath->substr(0, row.ordPath->size() - digits) + std::to_string(*row.ordNo);
    }
    reorderBelow(saved.oldSuperClass);
  }
  if (fits()) return true;
  *this = before;
  return false;
}

bool DirectoryModel::remove(const String& name) {
  const auto found = rows.find(name);
  if (found == rows.end()) return false;
  const Row old = found->second;
  rows.erase(found);
  rewrite(old, ".", ".");
  return true;
}

bool DirectoryModel::reorder(const String& superOrdPath, const std::vector<String>& names) {
  for (std::size_t i = 0; i < names.size(); ++i) {
    const auto found = rows.find(names[i]);
    if (found != rows.end()) {
      found->second.ordNo = static_cast<int>(i) + 1;
      found->second.ordPath = superOrdPath + padded(static_cast<int>(i) + 1);
    }
    reorderBelow(names[i]);
  }
  return true;
}

// Rows below the old place take the new one over; full names match between commas only.
void DirectoryModel::rewrite(const Row& before, const String& path, const String& fullName) {
  for (auto& [name, row] : rows) {
    if (!row.path.starts_with(before.path)) continue;
    row.path = replaceAll(row.path, before.path, path);
    const String full = replaceAll("," + row.fullName + ",", "," + before.fullName + ",", "," + fullName + ",");
    row.fullName = full.substr(1, full.size() - 2);
  }
}

// All rows at once, from the texts of before.
void DirectoryModel::reorderBelow(const String& name) {
  const std::map<String, Row> before = rows;
  for (auto& [own, row] : rows) {
    const auto superior = row.superClass ? before.find(*row.superClass) : before.end();
    if (superior == before.end() || !contains(row.path, "." + name + ".")) continue;
    if (superior->second.ordPath && row.ordNo)
      row.ordPath = *superior->second.ordPath + "." + padded(*row.ordNo);
    else
      row.ordPath.reset();
  }
}

bool DirectoryModel::fits() const {
  for (const auto& [name, row] : rows)
    if (row.path.size() > 850 || row.fullName.size() > 4000 || row.ordPath.value_or("").size() > 400) return false;
  return true;
}

std::vector<String> DirectoryModel::lines() const {
  std::vector<String> result;
  for (const auto& [name, row] : rows)
    result.push_back(name + "|" + row.superClass.value_or("-") + "|" + row.path + "|" + row.fullName + "|" +
                     (row.ordNo ? std::to_string(*row.ordNo) : "-") + "|" + row.ordPath.value_or("-"));
  return result;
}

}  // namespace QVSa::test
