#include "QVSa/hosting/SafeTexts.h"

#include <algorithm>

#include "QVSa/values/Text.h"

namespace QVSa {

namespace {

// A letter of another script is bytes above ASCII.
bool isPlain(unsigned char c) {
  return (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') || (c >= '0' && c <= '9') || c == '_' || c >= 0x80;
}

}  // namespace

String idList(const std::vector<Long>& ids) {
  std::vector<String> texts(ids.size());
  std::ranges::transform(ids, texts.begin(), text);
  return join(texts, ",");
}

String idPairs(const std::vector<std::pair<Long, Long>>& pairs) {
  std::vector<String> texts;
  texts.reserve(pairs.size());
  for (const auto& [user, job] : pairs) texts.push_back(text(user) + "," + text(job));
  return join(texts, "|");
}

Boolean isPlainPath(const String& path) {
  return std::ranges::none_of(path, [](unsigned char c) { return c == '\'' || c < ' '; });
}

Boolean isPlainName(const String& name) { return std::ranges::all_of(name, isPlain); }

}  // namespace QVSa
