#include "platform/NamedLines.h"

#include "QVSa/values/Text.h"

namespace QVSa::platform {

namespace {

String plain(std::string_view text) { return String(trimmed(text, " \t\r")); }

}  // namespace

std::vector<NamedLine> namedLines(const String& content) {
  std::vector<NamedLine> lines;
  Long number = 0;
  for (const String& line : split(content, '\n')) {
    ++number;
    const String text = plain(line);
    if (text.empty() || text.front() == '#') continue;
    const std::size_t mark = text.find('=');
    if (mark == String::npos)
      lines.push_back({number, "", ""});
    else
      lines.push_back({number, plain(text.substr(0, mark)), plain(text.substr(mark + 1))});
  }
  return lines;
}

}  // namespace QVSa::platform
