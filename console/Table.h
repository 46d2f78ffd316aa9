#pragma once

#include <vector>

#include "console/Answer.h"

namespace QVSa::console {

// Rows under aligned headings for a person, an array of objects for a program.
class Table {
 public:
  struct Column {
    String heading;
    String key;  // of the member in the document
  };

  explicit Table(std::vector<Column> columns) : columns_(std::move(columns)) {}
  // One value a column.
  void row(std::vector<Json> values) { rows_.push_back(std::move(values)); }
  std::size_t size() const { return rows_.size(); }

  String text() const;
  Json document() const;

 private:
  std::vector<Column> columns_;
  std::vector<std::vector<Json>> rows_;
};

// Named values of one thing, one a line.
class Sheet {
 public:
  Sheet& line(const String& label, const String& key, Json value);

  String text() const;
  const Json& document() const { return document_; }

 private:
  std::vector<std::pair<String, String>> lines_;
  Json document_ = Json::object();
};

}  // namespace QVSa::console
