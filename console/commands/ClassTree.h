#pragma once

#include <vector>

#include "QVSa/values/Values.h"

namespace QVSa::console {

struct ReportClass {
  String name;
  String superior;
  String path;      // the names from the top down, a dot around each
  String fullName;  // the same with commas between
  String ordPath;
};

// The classes of a listing that Directory::GetAll gave, in its order. Throws Refusal where it is none.
std::vector<ReportClass> readClasses(const String& xml);

// The tree as lines, drawn by the paths. A class whose superior is not listed stands at the top.
String drawTree(const std::vector<ReportClass>& classes);

}  // namespace QVSa::console
