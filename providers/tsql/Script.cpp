#include "QVSa/values/Text.h"
#include "providers/tsql/Parser.h"
#include "providers/tsql/Words.h"

namespace QVSa::tsql {
namespace {

constexpr std::string_view kBlanks = " \t\r\n";

}  // namespace

std::vector<String> splitScript(const String& script) {
  std::vector<String> batches;
  String batch;
  const auto finish = [&] {
    if (!trimmed(batch, kBlanks).empty()) batches.push_back(batch);
    batch.clear();
  };
  for (std::size_t begin = 0; begin < script.size();) {
    const std::size_t end = std::min(script.find('\n', begin), script.size() - 1) + 1;
    const std::string_view line = std::string_view(script).substr(begin, end - begin);
    if (sameWord(trimmed(line, kBlanks), "go"))
      finish();
    else
      batch += line;
    begin = end;
  }
  finish();
  return batches;
}

}  // namespace QVSa::tsql
