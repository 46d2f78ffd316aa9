#include "console/Table.h"

#include <algorithm>

#include "QVSa/values/Text.h"

namespace QVSa::console {

namespace {

// Places that a text takes on a terminal; the scripts of East Asia take two a character.
std::size_t widthOf(const String& text) {
  std::size_t width = 0;
  for (std::size_t i = 0; i < text.size(); ++i) {
    const auto byte = static_cast<unsigned char>(text[i]);
    if ((byte & 0xC0) == 0x80) continue;
    const bool wide =
        byte >= 0xF0 || (byte >= 0xE3 && byte <= 0xED) || (byte == 0xEF && text.compare(i, 2, "\xEF\xBC") == 0);
    width += wide ? 2 : 1;
  }
  return width;
}

String padded(const String& text, std::size_t width) {
  return text + String(width - std::min(width, widthOf(text)), ' ');
}

String lineOf(const std::vector<String>& cells, const std::vector<std::size_t>& widths) {
  String line;
  for (std::size_t i = 0; i < cells.size(); ++i) line += padded(cells[i], widths[i]) + "  ";
  return trimRight(line) + "\n";
}

}  // namespace

String Table::text() const {
  std::vector<std::vector<String>> lines(1);
  for (const Column& column : columns_) lines[0].push_back(column.heading);
  for (const auto& row : rows_) {
    auto& line = lines.emplace_back();
    for (const Json& value : row) line.push_back(shown(value));
  }
  std::vector<std::size_t> widths(columns_.size());
  for (const auto& line : lines)
    for (std::size_t i = 0; i < widths.size(); ++i) widths[i] = std::max(widths[i], widthOf(line[i]));
  String result;
  for (const auto& line : lines) result += lineOf(line, widths);
  return result;
}

Json Table::document() const {
  Json result = Json::array();
  for (const auto& row : rows_) {
    Json object = Json::object();
    for (std::size_t i = 0; i < columns_.size(); ++i) object[columns_[i].key] = row[i];
    result.push_back(std::move(object));
  }
  return result;
}

Sheet& Sheet::line(const String& label, const String& key, Json value) {
  lines_.emplace_back(label, shown(value));
  document_[key] = std::move(value);
  return *this;
}

String Sheet::text() const {
  std::size_t width = 0;
  for (const auto& [label, value] : lines_) width = std::max(width, widthOf(label));
  String result;
  for (const auto& [label, value] : lines_) result += lineOf({label, value}, {width, 0});
  return result;
}

}  // namespace QVSa::console
