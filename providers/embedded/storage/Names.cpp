#include "providers/embedded/storage/Names.h"

#include "providers/embedded/functions/CaseFolding.h"
#include "providers/embedded/functions/Utf8.h"
#include "providers/embedded/storage/Layout.h"

namespace QVSa::embedded {

bool isOwner(const std::string& name) { return name.empty() || sameName(name, "dbo"); }

std::optional<std::size_t> databaseByName(const std::string& name) {
  for (std::size_t i = 0; i < databaseNames.size(); ++i)
    if (sameName(name, databaseNames[i])) return i;
  return std::nullopt;
}

std::string foldName(const std::string& name) {
  std::string folded;
  folded.reserve(name.size());
  const char* at = name.data();
  const char* end = at + name.size();
  while (at != end) appendSymbol(folded, foldCase(nextSymbol(at, end)));
  return folded;
}

bool sameName(const std::string& a, const std::string& b) { return a == b || foldName(a) == foldName(b); }

std::string quoteName(const std::string& name) {
  std::string quoted = "\"";
  for (const char c : name) {
    if (c == '"') quoted += '"';
    quoted += c;
  }
  return quoted + '"';
}

}  // namespace QVSa::embedded
